// When the agent refreshes which feeds.

#include "Agent/AgentTask.h"
#include "Agent/RefreshPass.h"
#include "Foundation/ArrayOf.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Clock.h"
#include "Foundation/ClockTrust.h"
#include "Foundation/Logger.h"
#include "Foundation/NetworkConfig.h"
#include "Foundation/SleepNotifier.h"
#include "Foundation/URL.h"
#include "Model/EnclosureCore.h"
#include "Model/FeedCore.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/Database.h"
#include "SQLite/Transaction.h"

namespace Orvane {

using namespace Foundation;
using SQLite::gDatabase;

namespace {

constexpr double kSoonSeconds = 0.1;
/// The network takes a moment to come back.
constexpr double kSecondsAfterSleep = 3.0;

}  // namespace

/// A clock that was set back must not make it last.
bool AgentTask::isHeldOff() const {
    return mHoldOffUntil > Clock::current().now() && !ClockTrust::isFromWrongClock(mHoldOffUntil);
}

void AgentTask::scheduleNextRefresh() {
    // The timer stays: if it repeats, it is there to try again.
    if (!gDatabase->isOpen()) return;
    if (isHeldOff()) {
        gLogAgent.log("===== SCHEDULING REFRESH SKIPPED (now %.3f, hold off until %.3f) =====",
                      Clock::current().now(), mHoldOffUntil);
        const Ref<Date> end = Date::date(mHoldOffUntil);
        mRefreshTimer.start(end.get());
        mRefreshDeferred = true;
        return;
    }
    gLogAgent.log("===== SCHEDULING REFRESH =====");
    const SQLite::Transaction transaction(true);
    RefreshPass pass(sRefreshNowThreshold);
    pass.run();
    gDatabase->saveRows();
    mRefreshTimer.start(pass.getEarliestDate());
    gLogAgent.log("===== END SCHEDULING REFRESH (next run at %@)", pass.getEarliestDate());
    if (mRefreshCount == 0) EnclosureCore::startAutoDownloads();
}

void AgentTask::refreshSoon(Notification* notification) {
    const bool woke = IsEqual(notification->name, SleepNotifier::kDidWakeNotification.string());
    // Repeats, as a pass that finds no database leaves the timer alone. Any other sets it anew.
    mRefreshTimer.start(woke ? kSecondsAfterSleep : kSoonSeconds, true);
}

void AgentTask::networkChanged(Notification*) {
    gLogAgent.log("Notified that network configuration changed!");
    if (isHeldOff()) return;
    const Ref<ArrayOf<FeedCore>> feeds = SubscriptionCore::getSubscribedFeeds();
    for (FeedCore* feed : *feeds) {
        const AutoreleasePool pool;
        if (!NetworkConfig::isConfigError(feed->getLastError())) continue;
        gLogAgent.log("    retry <%@>", feed->mURL.getValue());
        feed->refresh(false, true);
    }
}

}  // namespace Orvane
