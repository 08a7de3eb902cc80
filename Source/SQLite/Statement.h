#pragma once

#include "Foundation/Uncopyable.h"

#include <cstdint>
#include <vector>

struct sqlite3_stmt;

namespace SQLite {

class ColumnList;
class Database;

/// A compiled statement. Made by `Database::compile`, and finalised when the connection closes,
/// whoever holds it then.
class Statement : Foundation::Uncopyable {
 public:
    /// Takes `vm` over.
    Statement(Database* database, sqlite3_stmt* vm);
    ~Statement();

    /// Ends a run, so that the next one starts from the beginning. Bindings stay.
    void reset();
    /// Finalises the statement, which can then not be used any more. A failure is logged.
    void invalidate();
    /// Whether it was compiled under the connection and the schema that are in force.
    bool isCurrent() const;

    /// Begins or goes on with a run: the result code.
    int step();

    /// The first result column of that name, compared without case; -1 if there is none.
    int columnIndex(const char* name) const;
    /// The column "rowID"; -1 if there is none.
    int rowIDColumn() const;
    /// For each column of the list the index of its result column, or -1. Found once and kept.
    const std::vector<int>& columnIndexes(const ColumnList& list) const;
    int columnCount() const { return mCols; }
    /// Gives the index back. Throws `AssertionFailure` if there is no such result column.
    int checkColumn(int column) const {
        if (column < 0 || column >= mCols) failColumn();
        return column;
    }

    sqlite3_stmt* vm() const { return mVM; }
    /// For logs.
    const void* getAddress() const { return mVM; }
    const char* sql() const;

 private:
    friend class Database;

    [[noreturn]] static void failColumn();
    void noteReprepared();

    Database* mDatabase;
    std::uint32_t mGeneration;  ///< that of the connection; 0 once invalid
    sqlite3_stmt* mVM;
    std::int32_t mCols;

    static constexpr int kUnknown = -2;
    mutable int mRowIDColumn = kUnknown;
    mutable const ColumnList* mIndexedList = nullptr;
    mutable std::vector<int> mIndexes;
    // The connection's statements, so that it can end them.
    Statement* mPrevious = nullptr;
    Statement* mNext = nullptr;
};

}  // namespace SQLite
