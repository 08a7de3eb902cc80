#include "Agent/RefreshPass.h"

#include "Foundation/ArrayOf.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Logger.h"
#include "Foundation/LongWork.h"
#include "Foundation/URL.h"
#include "Model/FeedCore.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/Exception.h"

namespace Orvane {

using Foundation::ArrayOf;
using Foundation::AutoreleasePool;
using Foundation::Date;
using Foundation::Ref;

namespace {

double secondsUntil(const Date* date) {
    return date ? -date->getTimeAgo() : FeedCore::kRefreshNever;
}

/// Whether a feed that is due soon had its turn too short a time ago. The end of its refresh starts
/// the next pass, which would start it again for ever.
bool wasJustRefreshed(const FeedCore& feed, double secondsUntilDue) {
    const double ago = feed.getRefreshInterval() - secondsUntilDue;
    return secondsUntilDue > 0 && ago < FeedCore::sMinimumRefreshInterval;
}

}  // namespace

void RefreshPass::run() {
    const Foundation::LongWork work("scheduling of refreshes");
    const Ref<ArrayOf<FeedCore>> feeds = SubscriptionCore::getSubscribedFeeds();
    for (FeedCore* feed : *feeds) {
        const AutoreleasePool pool;
        try {
            visit(*feed);
        } catch (const SQLite::Exception&) {
            throw;
        } catch (...) {
            Foundation::warnAboutCurrentException("void Orvane::AgentTask::scheduleNextRefresh()");
        }
    }
}

void RefreshPass::visit(FeedCore& feed) {
    const Ref<Date> next = feed.getNextRefreshDate();
    const double seconds = secondsUntil(next.get());
    if (gLogAgentVerbose.willLog()) {
        gLogAgentVerbose.log("    sched <%@>: in %.1lf sec (interval=%.1lf)", feed.mURL.getValue(),
                             seconds, feed.getRefreshInterval());
    }
    if (!next.get()) return;
    if (seconds <= mNowSeconds && !wasJustRefreshed(feed, seconds)) {
        feed.refresh(false, true);
    } else if (!mEarliest.get() || next->compare(*mEarliest) < 0) {
        mEarliest = next;
    }
}

}  // namespace Orvane
