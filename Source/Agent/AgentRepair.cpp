// What the agent does about a database that is broken, or is said to be.

#include "Agent/AgentTask.h"
#include "Foundation/Dictionary.h"
#include "Foundation/Logger.h"
#include "Foundation/String.h"
#include "Model/MinistryOfTruth.h"
#include "SQLite/Database.h"
#include "SQLite/Exception.h"

namespace Orvane {

using namespace Foundation;

namespace {

// Codes of SQLite's for which a client asks, and which the agent's having opened the database has
// dealt with.
constexpr int kBusy = 5;
constexpr int kNotFound = 12;        ///< there was no file
constexpr int kSchemaOutdated = 17;  ///< it waited for its migration

}  // namespace

void AgentTask::databaseBroke(Notification* notification) {
    gWarn.log("AgentTask: Notified of fatal database error");
    String* message = nullptr;
    if (const Dictionary* info = notification->info) message = info->getAs<String>("message");
    MinistryOfTruth::instance()->recoverBrokenDatabase(message);
}

void AgentTask::fixDatabaseRequested(int errorCode) {
    gLogAgent.log("FixDatabase called! errorCode=%i", errorCode);
    if (errorCode == kBusy || errorCode == kNotFound || errorCode == kSchemaOutdated) return;
    Ref<String> reason;
    try {
        SQLite::gDatabase->integrityCheck();
    } catch (const SQLite::Exception& exception) {
        doWarnAboutException(&exception, "void Orvane::AgentTask::fixDatabaseRequested(int)");
        reason = String::string(exception.what());
    }
    if (reason) MinistryOfTruth::instance()->recoverBrokenDatabase(reason);
}

}  // namespace Orvane
