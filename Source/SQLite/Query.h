#pragma once

#include "Foundation/Returner.h"
#include "Foundation/Uncopyable.h"
#include "SQLite/Param.h"
#include "SQLite/SQLText.h"
#include "SQLite/Types.h"

#include <cstddef>
#include <memory>

namespace Foundation {
class Data;
class Date;
class TimeZone;
class URL;
template <class T>
class ArrayOf;
}  // namespace Foundation

namespace SQLite {

class Database;
class Exception;
class Row;
class Statement;
class Table;

/// A statement of SQL that is compiled on first use, kept, and compiled again when the connection
/// or the schema has changed. It may be used again and again, also while a cursor of it is open.
///
/// Parameters count from 1. A binding stays until the statement is compiled again; so bind right
/// before running. Whatever sqlite3 reports is thrown as an `Exception`. Thread of the connection.
class Query : Foundation::Uncopyable {
 public:
    /// Without a text yet.
    explicit Query(Table* table);
    template <class... Args>
    Query(Database* database, SQLFormatString<Args...> format, const Args&... arguments)
        : Query(database, SQLText::format(format, arguments...)) {}
    template <class... Args>
    Query(Table* table, SQLFormatString<Args...> format, const Args&... arguments)
        : Query(table, SQLText::format(format, arguments...)) {}
    Query(Database* database, SQLText whole);
    /// The rows that it gives are the table's.
    Query(Table* table, SQLText whole);
    virtual ~Query();

    /// The compiled statement.
    Statement& statement();
    /// The same, handed over: the query has none until it comes back.
    std::unique_ptr<Statement> takeStatement();
    /// Keeps the statement for the next run, unless another has been compiled in between.
    void returnStatement(std::unique_ptr<Statement> statement);

    /// Throws `AssertionFailure` if the text has no parameter of that name, such as ":id".
    Param parameterNamed(const char* name);
    Param operator[](int index) { return Param(*this, index); }

    /// A null text, string, block, URL or time zone binds null. Without `copy`, the text must stay
    /// valid as long as the binding.
    void bind(int index, const char* text, bool copy);
    void bind(int index, const Foundation::String* value);
    void bind(int index, const Foundation::Data* value);
    void bind(int index, const Foundation::URL* value);
    void bind(int index, const Foundation::TimeZone* value);
    void bind(int index, int value);
    void bind(int index, long value) { bind(index, static_cast<long long>(value)); }
    void bind(int index, long long value);
    void bind(int index, double value);
    /// Binds the date's seconds, and 0.0 for null: that is how "no date" is stored.
    void bind(int index, const Foundation::Date* value);
    /// Binds the row's ID, and 0 for null. Throws `AssertionFailure` for a row without an ID.
    void bind(int index, const Row* row);
    void bind(int index, std::nullptr_t) { bindNull(index); }
    void bindNull(int index);
    /// Binds the ID of a row that need not be there as an object; 0 stands for none.
    void bindRowID(int index, RowID id);

    /// Runs a statement that gives no rows. The new row's ID for an insert, otherwise how many rows
    /// changed.
    long long execute();
    /// The first row, or null. REQUIRES: the query has a table.
    Foundation::Returner<Row> _firstRow();
    /// All rows, in order. REQUIRES: as above.
    Foundation::Returner<Foundation::ArrayOf<Row>> allRows();
    /// Ends the statement and forgets the text.
    void finalize();

    Database* getDatabase() const { return mDatabase; }
    Table* getTable() const { return mTable; }
    const char* getSQL() const { return mSQL.c_str(); }

 protected:
    void setSQL(SQLText text);

 private:
    friend class Cursor;

    void bindText(int index, const char* text, int length, bool copy);
    void bindBlob(int index, const void* bytes, int count);
    void checkBinding(int result);
    [[noreturn]] void fail(int code);

    Database* mDatabase;
    Table* mTable = nullptr;
    SQLText mSQL;
    std::unique_ptr<Statement> mStatement;
};

template <class T>
const Param& Param::operator=(const T& value) const {
    if constexpr (requires { mQuery->bind(mIndex, value, true); }) {
        mQuery->bind(mIndex, value, true);
    } else {
        mQuery->bind(mIndex, value);
    }
    return *this;
}

}  // namespace SQLite
