// How the agent looks after the database once a day.

#include "Agent/AgentTask.h"
#include "Agent/ExpiredEntries.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Clock.h"
#include "Foundation/ClockTrust.h"
#include "Foundation/GregorianDate.h"
#include "Foundation/Logger.h"
#include "Foundation/LongWork.h"
#include "Foundation/Number.h"
#include "Foundation/PreferenceKeys.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/CursorOf.h"
#include "SQLite/Database.h"
#include "SQLite/Exception.h"
#include "SQLite/QueryOf.h"
#include "SQLite/TableOf.h"
#include "SQLite/Transaction.h"

#include <cmath>

namespace Orvane {

using namespace Foundation;
using SQLite::gDatabase;
using SQLite::TableOf;

namespace {

/// Shorter runs are not worth a warning.
constexpr int kLongRunMilliseconds = 5001;

/// Counts from when it is made.
class StopWatch {
 public:
    int milliseconds() const {
        return static_cast<int>(std::lround((Clock::current().now() - mStart) * 1000));
    }

 private:
    const double mStart = Clock::current().now();
};

/// An interval that is read once and kept; a 0 is read again.
double keptInterval(double& kept, const PreferenceKey<double>& key) {
    if (kept == 0) kept = key.valueIn(AgentTask::getAgentPrefs());
    return kept;
}

DateReturner lastMidnight() {
    GregorianDate midnight(Clock::current().now());
    midnight.hour = 0;
    midnight.minute = 0;
    midnight.second = 0;
    return midnight.getDate();
}

template <class Body>
void forEachSubscription(Body&& body) {
    const auto all = TableOf<SubscriptionCore>::instance()->allRows();
    for (SQLite::CursorOf<SubscriptionCore> cursor(*all); cursor.hasRow(); cursor.nextRow()) {
        const AutoreleasePool pool;
        const Ref<SubscriptionCore> subscription = cursor.row();
        body(*subscription);
    }
}

}  // namespace

double AgentTask::sHygieneRunInterval = 0;
double AgentTask::sHygieneBackoffInterval = 0;

double AgentTask::getHygieneRunInterval() {
    return keptInterval(sHygieneRunInterval, AgentPreferences::kHygieneRunInterval);
}

double AgentTask::getHygieneBackoffInterval() {
    return keptInterval(sHygieneBackoffInterval, AgentPreferences::kHygieneBackoffInterval);
}

void AgentTask::_forgetIntervals() {
    sHygieneRunInterval = 0;
    sHygieneBackoffInterval = 0;
}

void AgentTask::scheduleHygieneTasks() {
    double last = AgentPreferences::kLastHygieneRun.valueIn(getAgentPrefs());
    if (ClockTrust::isFromWrongClock(last)) last = 0;
    const double next = last + getHygieneRunInterval();
    mNextHygieneDate = Date::date(next);
    const double backoff = getHygieneBackoffInterval();
    if (next + backoff < Clock::current().now()) {
        // Not now, when whoever has started the agent waits for it.
        mHygieneTimer.start(backoff, false);
    } else {
        mHygieneTimer.start(mNextHygieneDate.get());
    }
}

void AgentTask::hygieneTasks() {
    gLogAgent.log("===== Good morning! -- it's time for database calisthenics! =====");
    gLogAgent.log("Checking database integrity...");
    try {
        runHygieneTasks();
        gLogAgent.log("===== Finished with daily tasks =====");
    } catch (const SQLite::Exception& exception) {
        doWarnAboutException(&exception, "void Orvane::AgentTask::hygieneTasks()");
    }
    noteHygieneRun();
}

void AgentTask::runHygieneTasks() {
    const LongWork work("daily tasks");
    const StopWatch watch;
    const SQLite::Transaction transaction(true);
    const int begun = watch.milliseconds();
    {
        const LongWork check("integrity check");
        gDatabase->integrityCheck();
    }
    const int checked = watch.milliseconds();
    const bool expires = canExpire();
    const bool bumped = expires && bumpExpirationDates();
    const int bumping = watch.milliseconds();
    const int expunged = expires ? expungeOldArticles() : 0;
    const int expunging = watch.milliseconds();
    if (bumped || expunged != 0) updateAllUnreadCounts();
    const int counted = watch.milliseconds();
    gDatabase->vacuumIncrementally();
    const int total = watch.milliseconds();
    gLogAgent.log(
        "Daily Task times: transaction %d, integrity %d, expiration %d, expunge %d, unread-counts "
        "%d, vacuum %d, total %d",
        begun, checked - begun, bumping - checked, expunging - bumping, counted - expunging,
        total - counted, total);
    // Deliberately without the counts and the vacuum.
    if (expunging >= kLongRunMilliseconds) {
        gWarn.log("AgentTask: Daily Tasks took %d msec", expunging);
    }
}

/// By a clock that is years behind, entries that have just come are first seen long ago, and would
/// go by the dates that subscriptions have from better days.
bool AgentTask::canExpire() {
    if (!ClockTrust::isClockBehindBuild()) return true;
    const Ref<Date> now = Date::now();
    gWarn.log(
        "AgentTask: The clock says %@, which was before this was built. Nothing expires today",
        now);
    return false;
}

void AgentTask::noteHygieneRun() {
    const Ref<Number> now = Number::number(Clock::current().now());
    UntypedPref(getAgentPrefs(), AgentPreferences::kLastHygieneRun.name) = now.get();
    getAgentPrefs().synchronize();
    mNextHygieneDate = Date::nowPlus(getHygieneRunInterval());
    gLogAgent.log("=== Next daily task time: %@ ===", mNextHygieneDate);
    mHygieneTimer.start(mNextHygieneDate.get());
}

bool AgentTask::bumpExpirationDates() {
    bool bumped = false;
    try {
        gLogAgent.log("Bumping subscription expiration dates...");
        const Ref<Date> midnight = lastMidnight();
        TableOf<EntryCore>::instance()->saveRows();
        forEachSubscription([&](SubscriptionCore& subscription) {
            if (subscription.bumpExpirationDate(midnight.get())) bumped = true;
        });
        gDatabase->saveRows();
    } catch (...) {
        warnAboutCurrentException("bool Orvane::AgentTask::bumpExpirationDates()");
        return false;
    }
    return bumped;
}

int AgentTask::expungeOldArticles() {
    gLogAgent.log("Expunging old entries...");
    // Contents whose entries are gone would never be found again.
    const SQLite::Transaction transaction(true);
    TableOf<EntryCore>::instance()->uncacheRows();
    TableOf<EnclosureCore>::instance()->uncacheRows();
    TableOf<ContentCore>::instance()->uncacheRows();
    const int expired = ExpiredEntries().remove();
    return expired + ExpiredEntries::bustGhosts();
}

void AgentTask::updateAllUnreadCounts() {
    gLogAgent.log("Recomputing all subscription unread counts...");
    const SQLite::Transaction transaction(true);
    // What is counted is in the file.
    TableOf<EntryCore>::instance()->saveRows();
    forEachSubscription([](SubscriptionCore& subscription) {
        if (subscription.updateUnreadCount()) subscription.saveChanges();
    });
}

}  // namespace Orvane
