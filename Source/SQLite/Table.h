#pragma once

#include "Foundation/NotificationNames.h"
#include "Foundation/Ref.h"
#include "Foundation/Uncopyable.h"
#include "SQLite/Query.h"
#include "SQLite/Types.h"

#include <list>
#include <memory>
#include <set>
#include <unordered_map>

namespace Foundation {
class Dictionary;
}

namespace SQLite {

class ColumnList;
class Cursor;
class Database;
class Row;

/// A table of the file, and the objects of its rows: it hands out one object for a row as long as
/// somebody holds that or, for a table that retains its rows, as long as the row exists.
///
/// It knows which rows are changed or new and owns those until they are saved.
class Table : Foundation::Uncopyable {
 public:
    static constexpr const Foundation::NotificationName& kRowsChangedNotification =
        Foundation::NotificationNames::kRowsChanged;

    /// A query of a table that retains its rows reads only IDs once this many are in memory.
    static constexpr std::size_t kWarmRows = 5;

    /// Lists of these end with a null name.
    struct IndexSpec {
        const char* name;
        const char* columns;
    };
    struct TriggerSpec {
        const char* name;
        const char* when;
        const char* body;
    };

    /// `name` must outlive the table. `cacheAllRows` makes it know every row that it hands out,
    /// `retainRows`, which needs the other, makes it own them.
    Table(Database* database, const char* name, bool cacheAllRows, bool retainRows);
    virtual ~Table();

    /// The object of a row, which is read when it is used. Throws `AssertionFailure` for an ID
    /// below 1.
    virtual Foundation::Returner<Row> _rowWithID(RowID rowID);
    /// The object of the row that a cursor stands on, with what the cursor has of it; null if it
    /// stands on none. The result must have the column "rowID".
    virtual Foundation::Returner<Row> _rowForCursor(Cursor& cursor);
    virtual Foundation::Returner<Row> _allocRowWithID(RowID rowID) = 0;
    virtual void _rowAdded(Row* row);
    virtual void _rowChanged(Row* row);
    virtual void _rowSaved(Row* row, bool wasNew);
    virtual void _deleteRow(Row* row);
    /// Lets all rows go.
    virtual void databaseClosing();
    /// What another process has changed.
    virtual void _receiveChangeNotification(Foundation::Dictionary* changes);
    /// What has changed, here or elsewhere: is announced in this process.
    virtual void _postLocalChangeNotification(Foundation::Dictionary* changes);

    // These throw `Exception`, with the code 23 where the file may not be changed.

    /// Makes the table with its indexes and triggers, which may be null. One of its name is left as
    /// it is, with what indexes and triggers it has.
    void create(const char* columns, const IndexSpec* indexes, const TriggerSpec* triggers);
    /// An index of that name is left as it is.
    void addIndex(const char* name, const char* columns);
    void addColumn(const char* name, const char* declaration);
    /// Throws `Exception` with the code 23 unless rows may be changed.
    void requireChangeable() const;

    /// A query of the rows that meet the formatted condition.
    template <class... Args>
    std::unique_ptr<Query> queryWhere(SQLFormatString<Args...> format, const Args&... arguments) {
        return queryWhereText(SQLText::format(format, arguments...));
    }
    std::unique_ptr<Query> queryWhereText(const SQLText& condition);
    /// The columns that a query of rows needs: "*", or "rowID" where the rows are in memory.
    const char* _colsToFetch() const;

    /// The row if it is in memory, or null.
    Row* _cachedRowWithID(RowID rowID) const;
    /// Whether a row is new or changed.
    bool isChanged();
    /// Saves new rows, in the order in which they were added, and then changed ones by ID, in one
    /// transaction. Throws `Exception`; all of them are then still to be saved.
    void saveRows();
    /// Forgets all rows, new ones too. Those that somebody holds live on.
    void uncacheRows();

    Database* getDatabase() const { return mDatabase; }
    const char* getName() const { return mName; }
    std::size_t getCachedRowCount() const { return mRows.size(); }

    // For rows and columns.

    Query& _rowQuery();
    /// Inserts a row of those columns, a parameter for each.
    Query& _insertQuery(const ColumnList& columns);
    void _uncacheRow(Row* row);
    /// Owns a row of the file no longer than it owns others, as nothing of it is to be saved.
    void _rowUnchanged(Row* row);
    /// Makes a row changed again whose save was undone; a new one loses its ID.
    void _unsave(Row* row, bool wasNew, ColumnMask changed);
    /// Forgets what was read of the rows in memory, changes not.
    void _rolledBack();

 private:
    using Rows = std::unordered_map<RowID, Row*>;

    void _cacheRow(Row* row, bool retained);
    void _cacheNewRow(Row* row);
    void _uncacheNewRow(Row* row);
    void saveNewRows();
    void saveChangedRows();
    Row* changedRow(RowID rowID) const;
    void _applyChangeNotification(const Foundation::Dictionary* changes, bool unloadUpdated);
    void applyChange(const Foundation::String* key, std::int64_t action, bool unloadUpdated);
    void unloadRow(Row* row);
    void forgetRow(Rows::iterator entry);

    Database* mDatabase;
    const char* mName;
    std::unique_ptr<Query> mRowQuery;
    std::unique_ptr<Query> mDeleteQuery;
    std::unique_ptr<Query> mInsertQuery;
    bool mCacheAllRows;
    const bool mRetainRows;
    Rows mRows;
    std::list<Foundation::Ref<Row>> mNewRows;
    /// All changed rows of the file, and maybe some that are none any more: a table has thousands
    /// of rows in memory of which a save concerns one.
    std::set<RowID> mChangedRows;
    bool mChanged = false;
};

}  // namespace SQLite
