#pragma once

#include <Orvane/OVClient.h>

#include <functional>
#include <memory>
#include <vector>

namespace Commands {

/// Follows refreshes of a client's feeds from before they are asked for to their end.
class RefreshWatch : public OVClientDelegate {
 public:
    enum class State { Waiting, Running, Ended };
    struct Followed {
        std::shared_ptr<OVFeed> feed;
        State state = State::Waiting;
        std::size_t before = 0;  ///< entries that it had
    };

    /// Seconds without any sign of life after which feeds that have not begun count as not
    /// refreshed now: their servers have asked to be left alone.
    static constexpr double kQuietSeconds = 10;

    /// Becomes the client's delegate, as long as this lives.
    RefreshWatch(OVClient& client, const std::vector<std::shared_ptr<OVFeed>>& feeds);
    ~RefreshWatch() override;

    /// Turns the loop until all have ended, or nothing is to be expected any more; with `isPatient`
    /// in the first case alone. `progressed` is called when something has changed. False if the
    /// user has interrupted it.
    bool wait(bool isPatient, const std::function<void()>& progressed);

    const std::vector<Followed>& feeds() const { return mFeeds; }
    std::size_t endedCount() const;
    /// How many entries a feed has more than before.
    std::size_t newEntries(const Followed& followed) const;

    void feedDidBeginRefresh(const std::shared_ptr<OVFeed>& feed) override;
    void feedDidEndRefresh(const std::shared_ptr<OVFeed>& feed) override;

 private:
    void change(const std::shared_ptr<OVFeed>& feed, State state);
    bool isRunning() const;
    std::size_t count(const std::shared_ptr<OVFeed>& feed) const;

    OVClient& mClient;
    std::vector<Followed> mFeeds;
    bool mHasChanged = false;
};

}  // namespace Commands
