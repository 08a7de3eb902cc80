#include "RefreshWatch.h"

#include "EventLoop.h"

#include <algorithm>
#include <chrono>

namespace Commands {

RefreshWatch::RefreshWatch(OVClient& client, const std::vector<std::shared_ptr<OVFeed>>& feeds)
    : mClient(client) {
    for (const std::shared_ptr<OVFeed>& feed : feeds) {
        mFeeds.push_back({feed, State::Waiting, count(feed)});
    }
    mClient.setDelegate(this);
}

RefreshWatch::~RefreshWatch() {
    mClient.setDelegate(nullptr);
}

bool RefreshWatch::wait(bool isPatient, const std::function<void()>& progressed) {
    using Clock = std::chrono::steady_clock;
    auto last = Clock::now();
    const auto isDone = [&] {
        if (mHasChanged) {
            mHasChanged = false;
            last = Clock::now();
            progressed();
        }
        if (endedCount() == mFeeds.size()) return true;
        if (isRunning()) last = Clock::now();
        return !isPatient && Clock::now() - last > std::chrono::duration<double>(kQuietSeconds);
    };
    return EventLoop::turnUntil(isDone, -1);
}

std::size_t RefreshWatch::endedCount() const {
    return static_cast<std::size_t>(
        std::count_if(mFeeds.begin(), mFeeds.end(),
                      [](const Followed& each) { return each.state == State::Ended; }));
}

std::size_t RefreshWatch::newEntries(const Followed& followed) const {
    const std::size_t now = count(followed.feed);
    return now > followed.before ? now - followed.before : 0;
}

void RefreshWatch::feedDidBeginRefresh(const std::shared_ptr<OVFeed>& feed) {
    change(feed, State::Running);
}

void RefreshWatch::feedDidEndRefresh(const std::shared_ptr<OVFeed>& feed) {
    change(feed, State::Ended);
}

void RefreshWatch::change(const std::shared_ptr<OVFeed>& feed, State state) {
    for (Followed& each : mFeeds) {
        // Changes of entries that come later are told as a refresh as well.
        if (each.feed == feed && each.state != State::Ended) each.state = state;
    }
    mHasChanged = true;
}

bool RefreshWatch::isRunning() const {
    return std::any_of(mFeeds.begin(), mFeeds.end(),
                       [](const Followed& each) { return each.state == State::Running; });
}

std::size_t RefreshWatch::count(const std::shared_ptr<OVFeed>& feed) const {
    OVEntryQuery query;
    query.feeds = {feed};
    return mClient.entryCount(query);
}

}  // namespace Commands
