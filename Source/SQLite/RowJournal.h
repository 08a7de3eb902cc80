#pragma once

#include "Foundation/Ref.h"
#include "Foundation/Uncopyable.h"
#include "SQLite/Row.h"
#include "SQLite/Types.h"

#include <cstdint>
#include <deque>
#include <vector>

namespace SQLite {

class BasicToManyColumn;
class BasicToOneColumn;
class Table;

/// What the rows in memory must get back if the open transaction is rolled back: that they are
/// changed and in which columns, that they are new and have no ID, and what pointed at them while
/// they had none. Holds every row that was saved until the transaction ends.
class RowJournal : Foundation::Uncopyable {
 public:
    /// A to-one column that has taken a row's ID which a roll-back takes away again.
    struct Link {
        BasicToOneColumn* column;  ///< null when it has ended or points elsewhere
        Foundation::Ref<Row> target;
        RowID id;
        bool retains;
    };

    RowJournal() = default;
    ~RowJournal() { clear(); }

    /// Notes what the row is before it is written.
    void noteSave(Row& row);
    /// Notes that the column has taken the row's ID. Gives the entry, which stays where it is until
    /// `clear`.
    Link* noteLink(BasicToOneColumn& column, Row& target, bool retains);
    /// Notes the rows that a to-many column is about to forget.
    void noteChildren(Row& owner, BasicToManyColumn& column);
    /// Notes one of them that it is about to forget.
    void noteChild(Row& owner, BasicToManyColumn& column, Row& child);

    /// The transaction is committed.
    void clear();
    /// It is rolled back: brings the rows back, and makes the tables forget what they have read
    /// since. A failure is reported.
    void rollBack(const std::vector<Table*>& tables);

 private:
    struct Save {
        Foundation::Ref<Row> row;
        Table* table;
        bool wasNew;
        ColumnMask changed;
    };
    struct Children {
        Foundation::Ref<Row> owner;
        BasicToManyColumn* column;
        std::vector<Foundation::Ref<Row>> rows;
    };

    void restoreRows();
    void restoreLinks();
    void restoreChildren();

    std::vector<Save> mSaves;
    std::deque<Link> mLinks;
    std::vector<Children> mChildren;
};

}  // namespace SQLite
