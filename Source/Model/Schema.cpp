#include "Model/Schema.h"

#include "Foundation/AssertionFailure.h"
#include "Model/AuthorCore.h"
#include "Model/ClientCore.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/Transaction.h"

namespace Orvane {

namespace {

template <class T>
void createTable() {
    SQLite::TableOf<T>::instance()->create(T::kSchema, T::kSchemaIndexes, T::kSchemaTriggers);
}

}  // namespace

void Schema::createDatabase(const std::function<void()>& restore) {
    SQLite::Database* database = SQLite::gDatabase;
    OV_ASSERT(database != nullptr);
    // Can only be chosen while the file is empty.
    database->execute("PRAGMA auto_vacuum = INCREMENTAL");
    {
        const SQLite::Transaction transaction(true);
        database->setUserVersion(kVersion);
        createTables();
        if (restore) restore();
    }
    // Not before, as it fixes the mode of auto_vacuum.
    database->useWriteAheadLog();
}

void Schema::createTables() {
    createTable<ClientCore>();
    createTable<SubscriptionCore>();
    createTable<FeedCore>();
    createTable<EntryCore>();
    createTable<EnclosureCore>();
    createTable<AuthorCore>();
    createTable<ContentCore>();
}

}  // namespace Orvane
