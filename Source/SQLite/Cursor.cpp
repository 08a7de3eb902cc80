#include "SQLite/Cursor.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/Logger.h"
#include "Foundation/TimeZone.h"
#include "Foundation/URL.h"
#include "SQLite/Database.h"
#include "SQLite/Exception.h"
#include "SQLite/Statement.h"

#include <sqlite3.h>

#include <utility>

namespace SQLite {

using Foundation::AssertionFailure;
using Foundation::Data;
using Foundation::Date;
using Foundation::Ref;
using Foundation::String;
using Foundation::TimeZone;
using Foundation::URL;

Cursor::Cursor(Query& query) : mQuery(&query), mOwnsQuery(false) {
    _init();
}

Cursor::Cursor(Query* query, bool ownsQuery) : mQuery(query), mOwnsQuery(ownsQuery) {
    OV_ASSERT(query);
    // A constructor that throws gets no destructor.
    std::unique_ptr<Query> owned(ownsQuery ? query : nullptr);
    _init();
    (void)owned.release();
}

Cursor::~Cursor() {
    finalize();
    if (mOwnsQuery) delete mQuery;
}

void Cursor::_init() {
    mStatement = mQuery->takeStatement();
    gLogSQL.log("Cursor %p \"%s\" ...", mStatement->getAddress(), mQuery->getSQL());
    Database* database = mQuery->getDatabase();
    // A process that only reads must not keep the writer's log from being folded back.
    database->cursors().open(database->isOpen() && !database->isWriteable());
    nextRow();
}

bool Cursor::nextRow() {
    Statement* run = statement();
    (void)mQuery->getDatabase()->db();  // a connection that is closed has ended the statement
    ++mRowIndex;
    const int result = run->step();
    switch (result & 0xFF) {
        case SQLITE_ROW:
            gLogSQL.log("  step %p [%i]", run->getAddress(), mRowIndex);
            return true;
        case SQLITE_DONE:
            finalize();
            return false;
        default:
            failStep(result);
    }
}

void Cursor::failStep(int result) {
    Database* database = mQuery->getDatabase();
    mStatement->reset();
    gLogSQL.log("  step %p [%i] -- ERROR %i", mStatement->getAddress(), mRowIndex, result);
    const Exception exception(result, sqlite3_errmsg(database->db()), mQuery->getSQL());
    finalize();
    database->_throwQueryException(exception);
}

void Cursor::finalize() {
    if (!mStatement) return;
    gLogSQL.log("---end %p", mStatement->getAddress());
    mQuery->getDatabase()->cursors().close();
    mQuery->returnStatement(std::move(mStatement));
}

Statement* Cursor::statement() const {
    if (!mStatement) {
        AssertionFailure::failed("SQLite::Statement *SQLite::Cursor::statement() const",
                                 "mStatement", "Cursor has no more rows");
    }
    return mStatement.get();
}

int Cursor::checkColumn(int column) const {
    return statement()->checkColumn(column);
}

int Cursor::columnCount() const {
    return statement()->columnCount();
}

int Cursor::columnIndex(const char* name) const {
    return statement()->columnIndex(name);
}

int Cursor::intColumn(int column) const {
    return sqlite3_column_int(statement()->vm(), checkColumn(column));
}

long long Cursor::int64Column(int column) const {
    return sqlite3_column_int64(statement()->vm(), checkColumn(column));
}

long long Cursor::int64Column(const char* name) const {
    return int64Column(columnIndex(name));
}

RowID Cursor::rowID() const {
    const int column = statement()->rowIDColumn();
    return column < 0 ? 0 : sqlite3_column_int64(mStatement->vm(), column);
}

double Cursor::doubleColumn(int column) const {
    return sqlite3_column_double(statement()->vm(), checkColumn(column));
}

const char* Cursor::cStringColumn(int column) const {
    return reinterpret_cast<const char*>(
        sqlite3_column_text(statement()->vm(), checkColumn(column)));
}

std::string_view Cursor::textColumn(int column) const {
    const char* text = cStringColumn(column);
    return text ? std::string_view(text) : std::string_view();
}

std::string_view Cursor::blobColumn(int column) const {
    sqlite3_stmt* vm = statement()->vm();
    const void* bytes = sqlite3_column_blob(vm, checkColumn(column));
    const int count = sqlite3_column_bytes(vm, column);
    if (!bytes || count == 0) return {};
    return {static_cast<const char*>(bytes), static_cast<std::size_t>(count)};
}

Foundation::StringReturner Cursor::stringColumn(int column) const {
    return String::string(cStringColumn(column));
}

Foundation::URLReturner Cursor::urlColumn(int column) const {
    const Ref<String> text = stringColumn(column);
    return URL::url(text.get());
}

Foundation::Returner<Date> Cursor::dateColumn(int column) const {
    return Date::date(doubleColumn(column));
}

Foundation::DataReturner Cursor::dataColumn(int column) const {
    const std::string_view bytes = blobColumn(column);
    return bytes.data() ? Data::adopt(std::string(bytes)) : nullptr;
}

Foundation::Returner<TimeZone> Cursor::timeZoneColumn(int column) const {
    return TimeZone::timeZoneWithData(blobColumn(column));
}

}  // namespace SQLite
