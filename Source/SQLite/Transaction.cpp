#include "SQLite/Transaction.h"

#include "SQLite/Database.h"

namespace SQLite {

Transaction::Transaction(Database* database, bool immediate) : mDatabase(database) {
    if (mDatabase) mDatabase->beginTransaction(immediate);
}

Transaction::Transaction(bool immediate) : Transaction(gDatabase, immediate) {}

Transaction::~Transaction() noexcept(false) {
    if (mDatabase) mDatabase->endTransaction();
}

}  // namespace SQLite
