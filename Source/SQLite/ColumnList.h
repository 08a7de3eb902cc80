#pragma once

#include "Foundation/Uncopyable.h"
#include "SQLite/SQLText.h"
#include "SQLite/Types.h"

#include <initializer_list>
#include <vector>

namespace SQLite {

class Column;
class Cursor;
class Query;
class Row;
class Table;

/// What columns of one type do, for who knows a column only by its place in a list.
struct ColumnKind {
    void (*bind)(const Column& column, Query& query, int index);
    /// Saves the rows that a to-one or to-many column points at; null for a scalar one.
    void (*saveRows)(Column& column);
    /// Gives up the rows that it points at, when its own row is saved; null for a scalar one.
    void (*clear)(Column& column);
};

/// One column of a row class: its name in the table and where it is in the row.
struct ColumnSpec {
    const char* name;  ///< null for a to-many column, which is none of the table's own
    Column& (*in)(Row& row);
    /// Forgets the value and its changes.
    void (*unload)(Row& row);
    /// Takes over what a cursor has in a result column; not for a to-many column.
    void (*load)(Row& row, const Cursor& cursor, int index);
    const ColumnKind* kind;
};

template <class Member>
struct ColumnMember;
template <class Owner, class Type>
struct ColumnMember<Type Owner::*> {
    using Class = Owner;
    using ColumnType = Type;
};

/// The entry for a member: `column<&EntryCore::mTitle>("title")`.
template <auto Member>
ColumnSpec column(const char* name) {
    using Class = typename ColumnMember<decltype(Member)>::Class;
    using Type = typename ColumnMember<decltype(Member)>::ColumnType;
    return {name, [](Row& row) -> Column& { return static_cast<Class&>(row).*Member; },
            [](Row& row) { (static_cast<Class&>(row).*Member).unload(); },
            [](Row& row, const Cursor& cursor, int index) {
                if constexpr (requires(Type & type) { type.loadValue(cursor, index); }) {
                    (static_cast<Class&>(row).*Member).loadValue(cursor, index);
                }
            },
            &Type::kKind};
}
/// The entry for a to-many member.
template <auto Member>
ColumnSpec toMany() {
    return column<Member>(nullptr);
}

/// The columns of a row class, listed once: by this list a row is inserted, updated, read and
/// unloaded, so that names, order and members agree. Has the order of the table; the to-many
/// columns are kept apart. A function-static constant of the class, as it lives as long as the
/// process.
class ColumnList : Foundation::Uncopyable {
 public:
    static constexpr std::size_t kMostColumns = 64;  ///< as a mask has a bit for each

    /// Throws `AssertionFailure` for more columns than a mask can hold.
    ColumnList(std::initializer_list<ColumnSpec> columns);

    auto begin() const { return mColumns->begin(); }
    auto end() const { return mColumns->end(); }
    std::size_t count() const { return mColumns->size(); }
    const ColumnSpec& at(std::size_t index) const { return (*mColumns)[index]; }
    const std::vector<ColumnSpec>& toManyColumns() const { return *mToMany; }

    /// "insert into table (a, b) values (?, ?)"
    SQLText insertText(const char* table) const;

 private:
    // Never destroyed: the database saves rows when it ends with the process, behind the end of
    // what was made after it.
    std::vector<ColumnSpec>* const mColumns;
    std::vector<ColumnSpec>* const mToMany;
};

}  // namespace SQLite
