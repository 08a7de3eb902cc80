#include "EndToEnd/LifeModel.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>

namespace {

constexpr double kDay = 86400;
constexpr double kBackoff = 240;     ///< of a daily run that is overdue
constexpr double kRefreshNow = 120;  ///< what is due by then is due
constexpr double kShortestInterval = 60;
constexpr double kLatest = 65;  ///< the shortest rest of an agent, and what it takes to begin
constexpr double kNever = std::numeric_limits<double>::infinity();
/// Dates are numbers of seconds, of which sums are taken.
constexpr double kTolerance = 1e-3;

}  // namespace

// What clients do.

double LifeModel::expirationOf(const ModelSubscription& subscription) const {
    return subscription.expiration != 0 ? subscription.expiration
                                        : mClients.at(subscription.client).expiration;
}

/// Whether a subscription's patience has moved on to another day.
bool LifeModel::bump(ModelSubscription& subscription, double now) const {
    const double interval = expirationOf(subscription);
    if (!(interval > 0)) return false;
    const double date = std::floor(now / kDay) * kDay - interval;
    if (subscription.expirationDate && *subscription.expirationDate >= date) return false;
    subscription.expirationDate = date;
    return true;
}

void LifeModel::subscribe(const std::string& client, const std::string& url, double now) {
    std::unique_ptr<ModelFeed>& feed = mFeeds[url];
    if (!feed) feed = std::make_unique<ModelFeed>(url, now);
    ModelSubscription& subscription = feed->subscriptions[client];
    subscription.client = client;
    feed->since = now;
    if (bump(subscription, now)) subscription.unread = feed->countUnread(subscription);
}

void LifeModel::unsubscribe(const std::string& client, const std::string& url) {
    feed(url).subscriptions.erase(client);
    if (feed(url).subscriptions.empty()) mFeeds.erase(url);
}

void LifeModel::setIntervals(const std::string& client, const std::string& url, double refresh,
                             double expiration, double now) {
    ModelFeed& changed = feed(url);
    ModelSubscription& subscription = changed.subscriptions.at(client);
    subscription.refresh = refresh;
    changed.since = now;
    if (subscription.expiration == expiration) return;
    subscription.expiration = expiration;
    if (bump(subscription, now)) subscription.unread = changed.countUnread(subscription);
}

void LifeModel::setFlags(const std::string& url, const std::string& entry, bool read,
                         bool flagged) {
    ModelEntry& changed = feed(url).entries.at(entry);
    changed.flagged = flagged;
    if (changed.read == read) return;
    changed.read = read;
    feed(url).recount();
}

// What the agent does.

void LifeModel::take(const AgentEvent& event) {
    passTo(event.time);
    switch (event.kind) {
        case AgentEvent::Kind::Started:
            mHasAgent = true;
            scheduleDailyRun(event.time);
            break;
        case AgentEvent::Kind::EndedRefresh: {
            const auto found = mFeeds.find(event.url);
            if (found == mFeeds.end()) break;
            const bool isForced = mForced.erase(event.url) > 0;
            const bool isAgain = mTriedAgain.erase(event.url) > 0;
            if (!isForced && !isAgain) checkTime(*found->second, event.time);
            found->second->refresh(event.time, mServed(event.url, event.time), isForced, mRefused);
            break;
        }
        case AgentEvent::Kind::Rested:
            break;
        case AgentEvent::Kind::Gone:
            mHasAgent = false;
            mNextDailyRun = kNever;
            break;
    }
}

double LifeModel::intervalOf(const ModelFeed& feed) const {
    double interval = kNever;
    for (const auto& [client, each] : feed.subscriptions) {
        double wanted = each.refresh != 0 ? each.refresh : mClients.at(client).refresh;
        if (wanted == 0) wanted = 1800;
        if (wanted > 0) interval = std::min(interval, wanted);
    }
    return std::max(interval, kShortestInterval);
}

bool LifeModel::isScheduled(const ModelFeed& feed) {
    return std::any_of(feed.subscriptions.begin(), feed.subscriptions.end(),
                       [](const auto& each) { return each.second.refresh >= 0; });
}

/// When the feed is to be refreshed next, or could be at the earliest.
double LifeModel::dueDate(const ModelFeed& feed) const {
    return feed.refreshed == 0 ? feed.since : feed.refreshed + intervalOf(feed);
}

void LifeModel::checkTime(const ModelFeed& feed, double now) const {
    EXPECT_GE(now, dueDate(feed) - kRefreshNow - kTolerance) << "too early: " << feed.url;
}

void LifeModel::passTo(double now) {
    while (mHasAgent && mNextDailyRun <= now)
        runDaily(mNextDailyRun);
    for (const auto& [url, feed] : mFeeds) {
        if (intervalOf(*feed) == kNever) continue;
        // Whoever changes the schedule, or lets the machine sleep, is to blame.
        const double due = std::max({dueDate(*feed), feed->since, mExcusedUntil});
        EXPECT_LE(now, due + kLatest) << "not refreshed: " << url;
    }
}

void LifeModel::wake(double now) {
    mExcusedUntil = now;
    mNextDailyRun = std::max(mNextDailyRun, now);
}

void LifeModel::findNetwork() {
    for (const auto& [url, feed] : mFeeds) {
        if (feed->missesNetwork() && isScheduled(*feed)) mTriedAgain.insert(url);
    }
}

void LifeModel::scheduleDailyRun(double now) {
    const double next = mLastDailyRun + kDay;
    mNextDailyRun = next + kBackoff < now ? now + kBackoff : std::max(next, now);
}

void LifeModel::runDaily(double now) {
    ++mDailyRuns;
    bool moved = false;
    int gone = 0;
    for (const auto& [url, feed] : mFeeds) {
        for (auto& [client, subscription] : feed->subscriptions)
            moved = bump(subscription, now) || moved;
    }
    for (const auto& [url, feed] : mFeeds)
        gone += feed->expunge();
    mExpunged += gone;
    if (moved || gone > 0) {
        for (const auto& [url, feed] : mFeeds)
            feed->recount();
    }
    mLastDailyRun = now;
    mNextDailyRun = now + kDay;
}
