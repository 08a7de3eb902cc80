#include "Model/AuthorIndex.h"

#include "Foundation/String.h"
#include "Foundation/URL.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"

#include <algorithm>
#include <functional>
#include <string_view>

namespace Orvane {

using SQLite::Cursor;
using SQLite::RowID;

namespace {

std::size_t hashOf(std::string_view name, std::string_view email, std::string_view url) {
    const auto hash = std::hash<std::string_view>();
    // Which text stands where makes a difference.
    return hash(name) * 3 + hash(email) * 5 + hash(url) * 7;
}

template <class Text>
void bind(SQLite::Query& query, int index, const Text* text) {
    if (text) {
        query.bind(index, text);
    } else {
        query.bind(index, "", false);
    }
}

}  // namespace

AuthorIndex::AuthorIndex(SQLite::Database* database)
    : mDatabase(database),
      mLastQuery(database, "select max(rowID) from Authors"),
      mNewQuery(database, "select rowID,name,email,url from Authors where rowID>?"),
      mRowQuery(database,
                "select rowID from Authors  where rowID=? and ifnull(name,'')=?"
                " and ifnull(email,'')=? and ifnull(URL,'')=?") {}

AuthorIndex::~AuthorIndex() = default;

RowID AuthorIndex::find(const Texts& texts) {
    catchUp();
    using Foundation::String;
    const Foundation::Ref<String> url = texts.url ? texts.url->getString() : nullptr;
    const auto [begin, end] = mRows.equal_range(
        hashOf(String::view(texts.name), String::view(texts.email), String::view(url.get())));
    RowID first = 0;
    for (auto row = begin; row != end; ++row) {
        const bool isFirst = first == 0 || row->second < first;
        if (isFirst && isIn(row->second, texts)) first = row->second;
    }
    return first;
}

void AuthorIndex::catchUp() {
    const RowID last = Cursor(mLastQuery).int64Column(0);
    if (mGeneration != mDatabase->getGeneration() || last < mLast) {
        mRows.clear();
        mLast = 0;
        mGeneration = mDatabase->getGeneration();
    }
    if (last > mLast) readFrom(mLast);
}

/// The rows behind that one.
void AuthorIndex::readFrom(RowID last) {
    mNewQuery.bindRowID(1, last);
    for (Cursor cursor(mNewQuery); cursor.hasRow(); cursor.nextRow()) {
        mLast = std::max(mLast, RowID{cursor.int64Column(0)});
        mRows.emplace(hashOf(cursor.textColumn(1), cursor.textColumn(2), cursor.textColumn(3)),
                      cursor.int64Column(0));
    }
}

bool AuthorIndex::isIn(RowID rowID, const Texts& texts) {
    mRowQuery.bindRowID(1, rowID);
    bind(mRowQuery, 2, texts.name);
    bind(mRowQuery, 3, texts.email);
    bind(mRowQuery, 4, texts.url);
    return Cursor(mRowQuery).hasRow();
}

}  // namespace Orvane
