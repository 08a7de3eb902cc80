#pragma once

#include "EndToEnd/AgentKeeper.h"
#include "EndToEnd/ModelFeed.h"

#include <functional>
#include <limits>
#include <map>
#include <memory>
#include <optional>
#include <set>
#include <string>

/// What the clients have set for all their feeds.
struct ModelClient {
    double refresh = 1800;
    double expiration = 1209600;
};

/// All that the store must hold, computed of what was served, what clients asked for, and when the
/// agent lived.
class LifeModel {
 public:
    using Source = std::function<std::deque<Served>(const std::string& url, double time)>;

    /// `served` gives what a feed has served at a time.
    explicit LifeModel(Source served) : mServed(std::move(served)) {}

    // What clients do.

    void addClient(const std::string& client, ModelClient settings) { mClients[client] = settings; }
    void subscribe(const std::string& client, const std::string& url, double now);
    void unsubscribe(const std::string& client, const std::string& url);
    void setIntervals(const std::string& client, const std::string& url, double refresh,
                      double expiration, double now);
    void setFlags(const std::string& url, const std::string& entry, bool read, bool flagged);
    /// A client asks for a refresh. False if one has been asked for already.
    bool force(const std::string& url) { return mForced.insert(url).second; }

    // What the agent does.

    void take(const AgentEvent& event);
    /// All has happened up to here. Whoever did not refresh what is due fails the test.
    void passTo(double now);
    /// The machine has slept up to here.
    void wake(double now);
    /// There is a network again.
    void findNetwork();
    /// Whether all has been tried again that failed for want of one.
    bool hasTriedAgain() const { return mTriedAgain.empty(); }

    const std::map<std::string, std::unique_ptr<ModelFeed>>& feeds() const { return mFeeds; }
    const std::map<std::string, ModelClient>& clients() const { return mClients; }
    int getExpunged() const { return mExpunged; }
    int getDailyRuns() const { return mDailyRuns; }

 private:
    ModelFeed& feed(const std::string& url) { return *mFeeds.at(url); }
    double intervalOf(const ModelFeed& feed) const;
    double expirationOf(const ModelSubscription& subscription) const;
    bool bump(ModelSubscription& subscription, double now) const;
    static bool isScheduled(const ModelFeed& feed);
    double dueDate(const ModelFeed& feed) const;
    void checkTime(const ModelFeed& feed, double now) const;
    void scheduleDailyRun(double now);
    void runDaily(double now);

    Source mServed;
    std::map<std::string, ModelClient> mClients;
    std::map<std::string, std::unique_ptr<ModelFeed>> mFeeds;
    std::set<std::string> mForced;
    std::set<std::string> mTriedAgain;  ///< or to be
    RefusedHosts mRefused;
    bool mHasAgent = false;
    double mLastDailyRun = 0;
    double mNextDailyRun = std::numeric_limits<double>::infinity();  ///< while there is an agent
    double mExcusedUntil = 0;
    int mExpunged = 0;
    int mDailyRuns = 0;
};
