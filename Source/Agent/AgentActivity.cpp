// What is under way in the agent, and what clients are told of it.

#include "Agent/AgentTask.h"
#include "Foundation/DistributedNotificationCenter.h"
#include "Foundation/Logger.h"
#include "Model/EnclosureCore.h"
#include "Model/FeedCore.h"
#include "SQLite/Database.h"
#include "SQLite/Table.h"

#include <string>

namespace Orvane {

using namespace Foundation;
using SQLite::gDatabase;

namespace {

/// Tells all processes of a feed, by its row.
void tellClients(const NotificationName& name, const FeedCore& feed, Dictionary* info) {
    const Ref<String> row = String::string(std::to_string(feed.getRowID()));
    NotificationCenter::getDistributed()->post(name, row.get(), info);
}

}  // namespace

/// Null for a feed in memory.
FeedCore* AgentTask::storedFeed(const Notification* notification) {
    auto* feed = notification->getObject<FeedCore>();
    return feed->getTable() && feed->getTable()->getDatabase() ? feed : nullptr;
}

void AgentTask::refreshStarted(Notification* notification) {
    const FeedCore* feed = storedFeed(notification);
    if (!feed) return;
    ++mRefreshCount;
    gLogAgentVerbose.log("Started refresh of %@ (now %i)", feed->mURL.getValue(), mRefreshCount);
}

void AgentTask::fetchStarted(Notification* notification) {
    const FeedCore* feed = storedFeed(notification);
    if (!feed) return;
    gLogAgentVerbose.log("Started actual HTTP fetch of %@", feed->mURL.getValue());
    tellClients(NotificationNames::kFeedBeganUpdateDist, *feed, nullptr);
}

void AgentTask::refreshFinished(Notification* notification) {
    const FeedCore* feed = storedFeed(notification);
    if (!feed) return;
    --mRefreshCount;
    gLogAgent.log("Ended refresh of %@ (status=%@) (%i left)", feed->mURL.getValue(),
                  feed->getLastError(), mRefreshCount);
    tellClients(NotificationNames::kFeedEndedUpdateDist, *feed, notification->info);
    if (mRefreshCount != 0) return;
    resetQuitTimer(kIdleSeconds);
    EnclosureCore::startAutoDownloads();
    scheduleNextRefresh();
}

void AgentTask::enclosureDownloadStarted(Notification*) {
    gDatabase->saveRows();
    ++mDownloadCount;
}

void AgentTask::enclosureDownloadEnded(Notification*) {
    gDatabase->saveRows();
    --mDownloadCount;
    if (mDownloadCount == 0 && !EnclosureCore::startAutoDownloads()) resetQuitTimer(kIdleSeconds);
}

}  // namespace Orvane
