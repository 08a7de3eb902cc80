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
    if (seconds <= mNowSeconds) {
        feed.refresh(false, true);
    } else if (!mEarliest.get() || next->compare(*mEarliest) < 0) {
        mEarliest = next;
    }
}

}  // namespace Orvane
