// When the agent ends, and when it is to be started again.

#include "Agent/AgentTask.h"
#include "Agent/AutoSync.h"
#include "Agent/ServiceManager.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Logger.h"
#include "Foundation/RunLoop.h"
#include "Model/FeedCore.h"
#include "Model/SubscriptionCore.h"
#include "Utilities/FileUtils.h"

#include <algorithm>

namespace Orvane {

using namespace Foundation;

namespace {

/// Clients may set intervals that no whole number holds.
std::int64_t wholeSeconds(double seconds) {
    constexpr double kMost = 9e18;
    return static_cast<std::int64_t>(std::min(seconds, kMost));
}

}  // namespace

void AgentTask::resetQuitTimer(double seconds) {
    mQuitTimer.stop();
    if (mDontQuit) return;
    gLogAgent.log("Agent will quit after %g seconds of inactivity.", seconds);
    mQuitTimer.start(seconds, false);
}

void AgentTask::receiveActivityNotification(Notification*) {
    resetQuitTimer(kIdleSeconds);
}

bool AgentTask::isBusy() const {
    if (mRefreshCount > 0 || mDownloadCount > 0) return true;
    if (FileUtils::isDeletingFilesAsynchronously()) return true;
    const AutoSync* sync = AutoSync::current();
    return sync && sync->isSyncing();
}

void AgentTask::quit() {
    if (isBusy()) {
        resetQuitTimer(kIdleSeconds);
        return;
    }
    double next = kLongestRest;
    try {
        findNextWork(next);
    } catch (...) {
        warnAboutCurrentException("void Orvane::AgentTask::quit()");
    }
    if (next < kShortestRest) {
        gLogAgent.log("Oops, start interval of %.1lf is too short", next);
        next = kShortestRest;
    }
    const std::int64_t seconds = wholeSeconds(next);
    const Ref<Date> date = Date::nowPlus(static_cast<double>(seconds));
    gLogAgent.log("Agent quitting. Scheduling restart by svcd in %lld seconds (at %@).", seconds,
                  date);
    if (const int error = ServiceManager::current().setStartInterval(seconds)) {
        gWarn.log("AgentTask: Got error updating launch interval: %i", error);
    }
    RunLoop::current().stop();
}

/// Leaves in `seconds` what was found before anything failed.
void AgentTask::findNextWork(double& seconds) const {
    if (const std::optional<double> refresh = getSecondsUntilRefresh()) seconds = *refresh;
    const AutoSync* sync = AutoSync::current();
    if (!sync || !sync->isEnabled()) return;
    const double syncSeconds = sync->getTimeRemaining();
    gLogAgent.log("Next fetch in %.1lf sec, next skerry sync in %.1lf sec", seconds, syncSeconds);
    seconds = std::min(seconds, syncSeconds);
}

std::optional<double> AgentTask::getSecondsUntilRefresh() {
    std::optional<double> earliest;
    const Ref<ArrayOf<FeedCore>> feeds = SubscriptionCore::getSubscribedFeeds();
    for (const FeedCore* feed : *feeds) {
        const AutoreleasePool pool;
        const Ref<Date> date = feed->getNextRefreshDate();
        if (!date) continue;
        const double seconds = -date->getTimeAgo();
        if (!earliest || seconds < *earliest) earliest = seconds;
    }
    return earliest;
}

}  // namespace Orvane
