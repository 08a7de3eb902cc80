#pragma once

#include "Foundation/Ref.h"
#include "Foundation/Uncopyable.h"
#include "SQLite/Query.h"

#include <cstdint>
#include <string_view>

namespace SQLite {

/// Walks the rows of a query, and stands on the first one from the start. It lends the query's
/// statement and gives it back when it has run out. While it stands on a row it holds a read lock,
/// so it must not live across a turn of the run loop in a process that only reads.
///
/// Values may be read only while `hasRow()`; else, and for a column that is not there, an
/// `AssertionFailure` is thrown. sqlite3 converts between types as it does.
class Cursor : Foundation::Uncopyable {
 public:
    /// A result column looked up by name.
    class Column {
     public:
        Column(const Cursor& cursor, int index) : mCursor(&cursor), mIndex(index) {}
        const Cursor& getCursor() const { return *mCursor; }
        /// Below 0 if the result has no such column.
        int getIndex() const { return mIndex; }

     private:
        const Cursor* mCursor;
        int mIndex;
    };

    template <class... Args>
    Cursor(Database* database, SQLFormatString<Args...> format, const Args&... arguments)
        : Cursor(new Query(database, format, arguments...), true) {}
    /// REQUIRES: the query outlives the cursor.
    explicit Cursor(Query& query);
    /// `ownsQuery` makes the query the cursor's own.
    Cursor(Query* query, bool ownsQuery);
    virtual ~Cursor();

    bool hasRow() const { return mStatement != nullptr; }
    /// Goes to the next row. Whether there is one.
    bool nextRow();
    /// Ends the walk early.
    void finalize();

    int columnCount() const;
    /// The first result column of that name, compared without case; -1 if there is none.
    int columnIndex(const char* name) const;
    Column column(const char* name) const { return {*this, columnIndex(name)}; }

    int intColumn(int column) const;
    long long int64Column(int column) const;
    long long int64Column(const char* name) const;
    double doubleColumn(int column) const;
    /// Null for null. Valid until the cursor moves.
    const char* cStringColumn(int column) const;
    /// The same, and the bytes of a blob: without data for null, and for a blob of 0 bytes.
    std::string_view textColumn(int column) const;
    std::string_view blobColumn(int column) const;
    Foundation::StringReturner stringColumn(int column) const;
    Foundation::URLReturner urlColumn(int column) const;
    Foundation::Returner<Foundation::Date> dateColumn(int column) const;
    /// Null for a blob of 0 bytes too.
    Foundation::DataReturner dataColumn(int column) const;
    Foundation::Returner<Foundation::TimeZone> timeZoneColumn(int column) const;
    /// The column "rowID"; 0 where the result has none.
    RowID rowID() const;
    /// Reads the ID of a row of the class's own table. 0 gives false and leaves `result` alone.
    /// Defined in `TableOf.h`.
    template <class ROW>
    bool getObject(int column, Foundation::Ref<ROW>& result) const;

    Query& getQuery() const { return *mQuery; }
    /// The statement that runs.
    Statement* statement() const;

 private:
    void _init();
    int checkColumn(int column) const;
    [[noreturn]] void failStep(int result);

    Query* mQuery;
    bool mOwnsQuery;
    std::unique_ptr<Statement> mStatement;
    std::int32_t mRowIndex = 0;
};

}  // namespace SQLite
