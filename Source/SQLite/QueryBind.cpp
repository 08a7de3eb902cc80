#include "Foundation/AssertionFailure.h"
#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/Logger.h"
#include "Foundation/Ref.h"
#include "Foundation/TimeZone.h"
#include "Foundation/URL.h"
#include "SQLite/Database.h"
#include "SQLite/Exception.h"
#include "SQLite/Query.h"
#include "SQLite/Row.h"
#include "SQLite/Statement.h"

#include <sqlite3.h>

#include <limits>

namespace SQLite {

using Foundation::Data;
using Foundation::Date;
using Foundation::Ref;
using Foundation::String;
using Foundation::TimeZone;
using Foundation::URL;

namespace {

/// sqlite3 counts bytes in an int; what is longer is too big for it anyway.
int byteCount(std::size_t size) {
    constexpr std::size_t kMost = std::numeric_limits<int>::max();
    return static_cast<int>(size < kMost ? size : kMost);
}

}  // namespace

Param Query::parameterNamed(const char* name) {
    const int index = sqlite3_bind_parameter_index(statement().vm(), name);
    OV_ASSERT_MESSAGE_AS(index > 0, "index>0", "Unknown parameter name");
    return Param(*this, index);
}

void Query::checkBinding(int result) {
    if (result == SQLITE_OK) return;
    mDatabase->_throwQueryException(Exception(result, "Error binding param", getSQL()));
}

void Query::bindText(int index, const char* text, int length, bool copy) {
    Statement& bound = statement();
    gLogSQL.log("\tBIND %p[%i] = '%s'", bound.getAddress(), index, text);
    checkBinding(sqlite3_bind_text(bound.vm(), index, text, length,
                                   copy ? SQLITE_TRANSIENT : SQLITE_STATIC));
}

void Query::bind(int index, const char* text, bool copy) {
    if (!text) return bindNull(index);
    bindText(index, text, -1, copy);
}

void Query::bind(int index, const String* value) {
    if (!value) return bindNull(index);
    bindText(index, value->utf8().c_str(), byteCount(value->utf8().size()), true);
}

void Query::bindBlob(int index, const void* bytes, int count) {
    Statement& bound = statement();
    gLogSQL.log("\tBIND %p[%i] = Data (%i bytes)", bound.getAddress(), index, count);
    // A null pointer would bind null, and an empty block is not that.
    checkBinding(sqlite3_bind_blob(bound.vm(), index, bytes ? bytes : "", count, SQLITE_TRANSIENT));
}

void Query::bind(int index, const Data* value) {
    if (!value) return bindNull(index);
    bindBlob(index, value->getBytes(), byteCount(value->getLength()));
}

void Query::bind(int index, const URL* value) {
    if (!value) return bindNull(index);
    const Ref<String> text = value->getString();
    bind(index, text.get());
}

void Query::bind(int index, const TimeZone* value) {
    if (!value) return bindNull(index);
    bindBlob(index, value->getName().data(), byteCount(value->getName().size()));
}

void Query::bind(int index, int value) {
    Statement& bound = statement();
    gLogSQL.log("\tBIND %p[%i] = %i", bound.getAddress(), index, value);
    checkBinding(sqlite3_bind_int(bound.vm(), index, value));
}

void Query::bind(int index, long long value) {
    Statement& bound = statement();
    gLogSQL.log("\tBIND %p[%i] = %lld", bound.getAddress(), index, value);
    checkBinding(sqlite3_bind_int64(bound.vm(), index, value));
}

void Query::bind(int index, double value) {
    Statement& bound = statement();
    gLogSQL.log("\tBIND %p[%i] = %.2f", bound.getAddress(), index, value);
    checkBinding(sqlite3_bind_double(bound.vm(), index, value));
}

void Query::bind(int index, const Date* value) {
    bind(index, Date::getAbsoluteTime(value));
}

void Query::bind(int index, const Row* row) {
    const RowID id = row ? row->getRowID() : 0;
    OV_ASSERT_MESSAGE_AS(!row || id > 0, "id>0", "Can't bind query param to an unsaved row");
    bindRowID(index, id);
}

void Query::bindRowID(int index, RowID id) {
    Statement& bound = statement();
    gLogSQL.log("\tBIND %p[%i] = row %lld", bound.getAddress(), index, id);
    checkBinding(sqlite3_bind_int64(bound.vm(), index, id));
}

void Query::bindNull(int index) {
    Statement& bound = statement();
    gLogSQL.log("\tBIND %p[%i] = null", bound.getAddress(), index);
    checkBinding(sqlite3_bind_null(bound.vm(), index));
}

}  // namespace SQLite
