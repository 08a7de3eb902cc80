#pragma once

#include "Foundation/Date.h"
#include "Foundation/Notification.h"
#include "Foundation/RefCounted.h"
#include "Foundation/Timer.h"

#include <cstdint>
#include <memory>
#include <optional>

namespace Foundation {
class Prefs;
}

namespace Orvane {

class FeedCore;

/// The agent's work: opens the database, refreshes what is due, looks after the database once a
/// day, and decides when the process has been idle for long enough to end.
///
/// One per process, on the stack of `OVAgentFrameworkMain`, which turns the run loop that all of it
/// lives on. Its end closes the database of the process.
class AgentTask : public Foundation::RefCounted {
 public:
    using Date = Foundation::Date;
    using Notification = Foundation::Notification;

    static constexpr double kPauseSeconds = 30.0;      ///< for a debugger to be attached
    static constexpr double kHoldOffSeconds = 2.0;     ///< without a refresh, after the start
    static constexpr double kFirstIdleSeconds = 15.0;  ///< before the end, if nobody calls
    static constexpr double kIdleSeconds = 120.0;      ///< before the end, after any activity
    static constexpr double kLongestRest = 3.1536e7;   ///< seconds until the next start: 365 days
    static constexpr double kShortestRest = 60.0;      ///< seconds until the next start
    static constexpr double sRefreshNowThreshold = 120.0;  ///< seconds; what is due by then is due

    /// Throws `AssertionFailure` if there is one.
    AgentTask();
    /// Closes the database of the process, saving changes. A failure is reported.
    ~AgentTask() override;

    /// Throws `AssertionFailure` if there is none.
    static AgentTask& sharedInstance();

    /// Opens the database and begins the work. Throws what `MinistryOfTruth::openDatabase` does.
    /// That the tables cannot be read is reported, and the agent serves all the same.
    void start(bool registerType);
    /// The preferences of the running application.
    static Foundation::Prefs& getAgentPrefs();
    /// Tells the desktop what documents the program is for. A failure draws a warning.
    static void registerWithTypeRegistry();

    // The end of the process.

    /// Ends the run loop, and has the service manager start the process when there is work again;
    /// or waits `kIdleSeconds` more if something is under way.
    void quit();
    /// Puts `quit` off to `seconds` from now, or for good where the process is never to end.
    void resetQuitTimer(double seconds);

    // The database's repair.

    /// Makes the database anew from the files beside it.
    void databaseBroke(Notification* notification);
    /// A client could not use the database, for a result code of SQLite. Makes it anew if it is
    /// broken indeed. Throws what `MinistryOfTruth::recoverBrokenDatabase` does.
    void fixDatabaseRequested(int errorCode);

    // What is under way. Feeds in memory do not count.

    void refreshStarted(Notification* notification);
    void fetchStarted(Notification* notification);
    void refreshFinished(Notification* notification);
    void enclosureDownloadStarted(Notification* notification);
    void enclosureDownloadEnded(Notification* notification);
    void receiveActivityNotification(Notification* notification);

    // Refreshing: see AgentRefreshing.cpp.

    /// Refreshes the feeds that are due, and looks again when the next one is. Throws
    /// `SQLite::Exception`.
    void scheduleNextRefresh();
    /// Runs the pass soon, and again until the database is open.
    void refreshSoon(Notification* notification);
    /// Refreshes the feeds that failed for want of a network.
    void networkChanged(Notification* notification);

    // The daily run: see AgentHygiene.cpp.

    /// Arms the timer of the daily run.
    void scheduleHygieneTasks();
    /// Checks the database, lets old entries go and gives space back. A failure of the database is
    /// reported, and the run counts as done.
    void hygieneTasks();
    /// Moves the subscriptions' expiration dates on. Whether any moved; a failure is reported.
    bool bumpExpirationDates();
    /// Deletes the entries that have expired. How many rows that were. Throws `SQLite::Exception`.
    int expungeOldArticles();
    /// Counts the unread entries of every subscription anew. Throws `SQLite::Exception`.
    void updateAllUnreadCounts();
    /// Seconds from one daily run to the next.
    static double getHygieneRunInterval();
    /// Seconds by which a run that is overdue is put off.
    static double getHygieneBackoffInterval();

    // For tests.

    /// Both intervals are read anew.
    static void _forgetIntervals();
    std::int32_t getRefreshCount() const { return mRefreshCount; }
    std::int32_t getDownloadCount() const { return mDownloadCount; }
    double getHoldOffUntil() const { return mHoldOffUntil; }
    Date* getNextHygieneDate() const { return mNextHygieneDate.get(); }
    const Foundation::AbstractTimer& getHygieneTimer() const { return mHygieneTimer; }
    const Foundation::AbstractTimer& getRefreshTimer() const { return mRefreshTimer; }
    const Foundation::AbstractTimer& getQuitTimer() const { return mQuitTimer; }

 private:
    using Receiver = MethodReceiver<Notification, AgentTask>;
    using ReceiverPtr = std::unique_ptr<Receiver>;
    using Handler = void (AgentTask::*)(Notification*);

    void pauseIfAsked();
    void observeDatabase();
    void preloadTables();
    void observe();
    void observeSystem();
    void stopObserving();
    void closeDatabase();

    bool isHeldOff() const;
    void runHygieneTasks();
    static bool canExpire();
    void noteHygieneRun();

    bool isBusy() const;
    void findNextWork(double& seconds) const;
    static std::optional<double> getSecondsUntilRefresh();
    static FeedCore* storedFeed(const Notification* notification);

    static AgentTask* sSharedAgentTask;
    static double sHygieneRunInterval;      ///< 0 until it is first asked for
    static double sHygieneBackoffInterval;  ///< the same

    ReceiverPtr mRefreshStartedReceiver;
    ReceiverPtr mFetchStartedReceiver;
    ReceiverPtr mRefreshFinishedReceiver;
    ReceiverPtr mEnclosureStartedReceiver;
    ReceiverPtr mEnclosureEndedReceiver;
    ReceiverPtr mRefreshSoonReceiver;
    ReceiverPtr mNetworkChangedReceiver;
    ReceiverPtr mActivityReceiver;
    ReceiverPtr mDatabaseBrokeReceiver;
    Foundation::Timer<AgentTask> mHygieneTimer{this, &AgentTask::hygieneTasks};
    Foundation::Timer<AgentTask> mRefreshTimer{this, &AgentTask::scheduleNextRefresh};
    Foundation::Timer<AgentTask> mQuitTimer{this, &AgentTask::quit};
    double mHoldOffUntil = 0;  ///< no feed is refreshed by itself before
    Foundation::Ref<Date> mNextHygieneDate;
    std::int32_t mRefreshCount = 0;   ///< of stored feeds, now
    std::int32_t mDownloadCount = 0;  ///< of enclosures, now
    bool mDontQuit = false;
    bool mRefreshDeferred = false;  ///< a pass fell into the hold-off; for whoever looks at a dump
};

}  // namespace Orvane
