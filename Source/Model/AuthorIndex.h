#pragma once

#include "Foundation/Uncopyable.h"
#include "SQLite/Query.h"
#include "SQLite/Types.h"

#include <cstddef>
#include <cstdint>
#include <unordered_map>

namespace Foundation {
class String;
class URL;
}  // namespace Foundation

namespace SQLite {
class Database;
}

namespace Orvane {

/// Finds authors by what they are called. Their table has no index, and whoever stores entries asks
/// it for each of them: with the authors of some thousand feeds a look at all rows costs more than
/// all else that is done for an entry.
///
/// It is made of what the file has: rows that have come since the last time are read, and what is
/// found is looked at in the file. A file that has lost rows is read anew.
class AuthorIndex : Foundation::Uncopyable {
 public:
    /// What an author is called. Null is the same as empty.
    struct Texts {
        const Foundation::String* name;
        const Foundation::String* email;
        const Foundation::URL* url;
    };

    /// The database must outlive it.
    explicit AuthorIndex(SQLite::Database* database);
    ~AuthorIndex();

    /// The first row of an author, or 0. Throws `SQLite::Exception`.
    SQLite::RowID find(const Texts& texts);
    /// How many rows it knows.
    std::size_t getCount() const { return mRows.size(); }

 private:
    void catchUp();
    void readFrom(SQLite::RowID last);
    bool isIn(SQLite::RowID rowID, const Texts& texts);

    SQLite::Database* const mDatabase;
    SQLite::Query mLastQuery;
    SQLite::Query mNewQuery;
    SQLite::Query mRowQuery;
    std::uint32_t mGeneration = 0;  ///< of the database: another file may have other rows
    SQLite::RowID mLast = 0;
    /// By a hash of the texts, which take more room than all else.
    std::unordered_multimap<std::size_t, SQLite::RowID> mRows;
};

}  // namespace Orvane
