#include "SQLite/Query.h"

#include "Foundation/ArrayOf.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/Clock.h"
#include "Foundation/Logger.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"
#include "SQLite/Exception.h"
#include "SQLite/Row.h"
#include "SQLite/Statement.h"
#include "SQLite/Table.h"

#include <sqlite3.h>
#include <strings.h>

#include <utility>

namespace SQLite {

using Foundation::Clock;
using Foundation::MutableArrayOf;

Query::Query(Table* table) : mDatabase(table ? table->getDatabase() : nullptr), mTable(table) {}

Query::Query(Database* database, SQLText whole) : mDatabase(database), mSQL(std::move(whole)) {}

Query::Query(Table* table, SQLText whole) : Query(table) {
    mSQL = std::move(whole);
}

Query::~Query() {
    finalize();
}

void Query::setSQL(SQLText text) {
    mStatement.reset();
    mSQL = std::move(text);
}

Statement& Query::statement() {
    mDatabase->_checkThread();
    if (mStatement && mStatement->isCurrent()) return *mStatement;
    if (mStatement) {
        gLogSQL.log("Recompiling Query[%p]", this);
        mStatement.reset();
    } else {
        gLogSQL.log("Compiling Query[%p]", this);
    }
    mStatement = mDatabase->compile(mSQL.c_str());
    return *mStatement;
}

std::unique_ptr<Statement> Query::takeStatement() {
    statement();
    return std::move(mStatement);
}

void Query::returnStatement(std::unique_ptr<Statement> statement) {
    if (mStatement) return;
    statement->reset();
    mStatement = std::move(statement);
}

void Query::finalize() {
    mStatement.reset();
    mSQL = SQLText();
}

long long Query::execute() {
    Statement& run = statement();
    mDatabase->_requireTransaction();
    const bool timed = gLogSQL.willLog();
    const double start = timed ? Clock::current().now() : 0;
    const int result = run.step();
    if (timed) {
        const double seconds = Clock::current().now() - start;
        if (mDatabase->isInTransaction()) {
            gLogSQL.log("Query %p (%s ) -->%i [%.3f sec] ", run.getAddress(), getSQL(), result,
                        seconds);
        } else {
            gLogSQL.log("Query %p %s -->%i [%.3f sec]", run.getAddress(), getSQL(), result,
                        seconds);
        }
    }
    if ((result & 0xFF) != SQLITE_DONE) {
        const Exception exception(result, sqlite3_errmsg(mDatabase->db()), getSQL());
        run.reset();
        mDatabase->_throwQueryException(exception);
    }
    const bool inserts = strncasecmp(getSQL(), "insert", 6) == 0;
    const long long value =
        inserts ? mDatabase->lastInsertedRowID() : sqlite3_changes(mDatabase->db());
    mDatabase->check(sqlite3_reset(run.vm()));
    return value;
}

Foundation::Returner<Row> Query::_firstRow() {
    Cursor cursor(*this);
    if (!cursor.hasRow()) return nullptr;
    OV_ASSERT(mTable);
    return mTable->_rowForCursor(cursor);
}

Foundation::Returner<Foundation::ArrayOf<Row>> Query::allRows() {
    OV_ASSERT(mTable);
    Foundation::Ref<MutableArrayOf<Row>> rows{MutableArrayOf<Row>::array()};
    for (Cursor cursor(*this); cursor.hasRow(); cursor.nextRow()) {
        rows->add(mTable->_rowForCursor(cursor));
    }
    return Foundation::Returner<MutableArrayOf<Row>>(std::move(rows));
}

}  // namespace SQLite
