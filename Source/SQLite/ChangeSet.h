#pragma once

#include "Foundation/DictionaryOf.h"
#include "Foundation/Number.h"
#include "SQLite/Types.h"

#include <map>
#include <string>
#include <vector>

namespace SQLite {

/// What happened to rows of one table: row IDs in decimal and action numbers, which are those of
/// sqlite3's update hook.
using TableChangeDict = Foundation::DictionaryOf<Foundation::String, Foundation::Number>;
/// The same for tables, by name. A property list.
using ChangeDict = Foundation::DictionaryOf<Foundation::String, TableChangeDict>;

namespace ChangeAction {
inline constexpr int kDelete = 9;
inline constexpr int kInsert = 18;
inline constexpr int kUpdate = 23;
}  // namespace ChangeAction

/// The rows that changed and were not announced yet, each with the last thing that happened to it.
class ChangeSet {
 public:
    void note(int action, const char* table, RowID rowID);
    /// The form in which it is announced.
    Foundation::Returner<ChangeDict> dictionary() const;

 private:
    struct Change {
        RowID rowID;
        int action;
    };
    /// What happened to a table's rows, in order. A row that comes again and again is only kept so
    /// often that the list stays in proportion to the rows.
    struct Changes {
        std::vector<Change> list;
        std::size_t tidyAt = 1024;  ///< the length at which the list is next made short
    };

    /// Leaves the last change of each row, by ID.
    static void tidy(std::vector<Change>& list);
    static Foundation::Returner<TableChangeDict> describe(std::vector<Change> list);

    std::map<std::string, Changes, std::less<>> mTables;
};

/// A change set for the log: for each table a line with its name, and the row IDs with "+" for an
/// insert, "-" for a delete, nothing for an update and "?" for anything else. Takes null.
Foundation::StringReturner describeChanges(const Foundation::Dictionary* changes);

}  // namespace SQLite
