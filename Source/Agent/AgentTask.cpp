#include "Agent/AgentTask.h"

#include "Agent/AutoSync.h"
#include "Agent/TypeRegistry.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Clock.h"
#include "Foundation/DistributedNotificationCenter.h"
#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/NetworkConfig.h"
#include "Foundation/PreferenceKeys.h"
#include "Foundation/SleepNotifier.h"
#include "Foundation/Switches.h"
#include "Model/ClientCore.h"
#include "Model/EnclosureCore.h"
#include "Model/FeedCore.h"
#include "Model/MinistryOfTruth.h"
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

namespace {

NotificationCenter& local() {
    return *NotificationCenter::getLocal();
}

NotificationCenter& distributed() {
    return *NotificationCenter::getDistributed();
}

/// Brings all rows of a table into memory, if that keeps them.
template <class T>
void preload() {
    const auto query = SQLite::TableOf<T>::instance()->allRows();
    for (SQLite::CursorOf<T> cursor(*query); cursor.hasRow(); cursor.nextRow()) {
        const AutoreleasePool pool;
        const Ref<T> row = cursor.row();
        row->preloaded();
    }
}

}  // namespace

AgentTask* AgentTask::sSharedAgentTask = nullptr;

AgentTask::AgentTask() {
    OV_ASSERT_MESSAGE_AS(!sSharedAgentTask, "!sSharedAgentTask",
                         "There is already an AgentTask instance");
    sSharedAgentTask = this;
}

AgentTask::~AgentTask() {
    callGuarded("virtual Orvane::AgentTask::~AgentTask()", [this] {
        stopObserving();
        closeDatabase();
    });
    sSharedAgentTask = nullptr;
}

AgentTask& AgentTask::sharedInstance() {
    OV_ASSERT_MESSAGE_AS(sSharedAgentTask, "sSharedAgentTask", "No AgentTask instance");
    return *sSharedAgentTask;
}

Prefs& AgentTask::getAgentPrefs() {
    return Prefs::applicationPrefs();
}

void AgentTask::registerWithTypeRegistry() {
    if (!TypeRegistry::current().registerApplication()) {
        gWarn.log("Could not register Orvane Agent with Type Registry!");
    }
}

void AgentTask::start(bool registerType) {
    pauseIfAsked();
    gLogAgent.log("Starting AgentTask");
    if (GetBoolEnv("OVAgentDontQuit")) {
        gLogAgent.log("OVAgentDontQuit is set -- No quit timer");
        mDontQuit = true;
    }
    ClientCore::removeOldSvcdPlist();
    if (registerType) registerWithTypeRegistry();
    MinistryOfTruth::instance()->openDatabase();
    observeDatabase();
    try {
        preloadTables();
    } catch (const SQLite::Exception& exception) {
        doWarnAboutException(&exception, "void Orvane::AgentTask::start(bool)");
    }
    observe();

    const double now = Clock::current().now();
    mHoldOffUntil = now + kHoldOffSeconds;
    gLogAgent.log("Time now %.3f, hold off until %.3f", now, mHoldOffUntil);
    resetQuitTimer(kFirstIdleSeconds);
    mRefreshTimer.start(kHoldOffSeconds, false);
    AutoSync* sync = AutoSync::current();
    if (sync && sync->isEnabled()) sync->schedule();
}

void AgentTask::pauseIfAsked() {
    if (!AgentPreferences::kPauseOnLaunch.valueIn(getAgentPrefs()) &&
        !GetBoolEnv("OVPauseOnLaunch")) {
        return;
    }
    gLogAgent.log("Pausing 30 seconds before starting...");
    Clock::current().sleep(kPauseSeconds);
}

void AgentTask::preloadTables() {
    const double began = Clock::current().now();
    const SQLite::Transaction transaction(true);
    preload<ClientCore>();
    preload<FeedCore>();
    preload<SubscriptionCore>();
    gDatabase->saveRows();
    gLogAgent.log("Preloading tables duration %d ms",
                  static_cast<int>(std::lround((Clock::current().now() - began) * 1000)));
    scheduleHygieneTasks();
}

void AgentTask::observeDatabase() {
    mDatabaseBrokeReceiver = receiver<Notification>(this, &AgentTask::databaseBroke);
    local().addObserver(mDatabaseBrokeReceiver.get(),
                        SQLite::Database::kDatabaseFatalErrorNotification, gDatabase);
}

void AgentTask::observe() {
    const auto observeWith = [this](ReceiverPtr& made, Handler handler, NotificationCenter& center,
                                    const NotificationName& name) {
        if (!made) made = receiver<Notification>(this, handler);
        center.addObserver(made.get(), name, nullptr);
    };
    observeWith(mRefreshStartedReceiver, &AgentTask::refreshStarted, local(),
                FeedCore::kWillRefreshNotification);
    observeWith(mFetchStartedReceiver, &AgentTask::fetchStarted, local(),
                FeedCore::kBeganUpdateLocalNotification);
    observeWith(mRefreshFinishedReceiver, &AgentTask::refreshFinished, local(),
                FeedCore::kEndedUpdateLocalNotification);
    observeWith(mEnclosureStartedReceiver, &AgentTask::enclosureDownloadStarted, distributed(),
                NotificationNames::kEnclosureDownloadStarted);
    observeWith(mEnclosureEndedReceiver, &AgentTask::enclosureDownloadEnded, distributed(),
                NotificationNames::kEnclosureDownloadEnded);
    observeWith(mRefreshSoonReceiver, &AgentTask::refreshSoon, local(),
                SubscriptionCore::kRefreshScheduleChangedNotification);
    SleepNotifier::start();
    observeWith(mRefreshSoonReceiver, &AgentTask::refreshSoon, local(),
                SleepNotifier::kDidWakeNotification);
    NetworkConfig::start();
    observeWith(mNetworkChangedReceiver, &AgentTask::networkChanged, local(),
                NetworkConfig::kNetworkChangedNotification);
    observeWith(mActivityReceiver, &AgentTask::receiveActivityNotification, local(),
                NotificationNames::kCallHandled);
    observeWith(mActivityReceiver, &AgentTask::receiveActivityNotification, local(),
                NotificationNames::kSCGIHandlerCreated);
}

void AgentTask::stopObserving() {
    const auto stop = [](ReceiverPtr& receiver, NotificationCenter& center) {
        if (receiver) center.removeObserver(receiver.get());
        receiver.reset();
    };
    for (ReceiverPtr* each :
         {&mRefreshStartedReceiver, &mFetchStartedReceiver, &mRefreshFinishedReceiver,
          &mRefreshSoonReceiver, &mNetworkChangedReceiver, &mActivityReceiver,
          &mDatabaseBrokeReceiver}) {
        stop(*each, local());
    }
    stop(mEnclosureStartedReceiver, distributed());
    stop(mEnclosureEndedReceiver, distributed());
}

void AgentTask::closeDatabase() {
    if (!gDatabase) return;
    gLogAgent.log("===== Closing database =====");
    gDatabase->close(true);
}

}  // namespace Orvane
