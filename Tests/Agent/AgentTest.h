#pragma once

#include "Agent/AgentTask.h"
#include "Agent/AutoSync.h"
#include "Agent/ServiceManager.h"
#include "Agent/TypeRegistry.h"
#include "Foundation/Facilities.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/RunLoop.h"
#include "Model/ClientCore.h"
#include "Model/FeedTest.h"
#include "Model/StorageTest.h"
#include "Model/SubscriptionCore.h"
#include "Support/EnvVar.h"
#include "Support/LogCapture.h"

#include <limits>
#include <memory>
#include <string>
#include <vector>

/// A service manager that answers what the test says. It is that of the process while it lives.
class FakeServiceManager : public Orvane::ServiceManager {
 public:
    FakeServiceManager() { setCurrent(this); }
    ~FakeServiceManager() override { setCurrent(nullptr); }

    bool isManaged() override { return managed; }
    Reply checkIn() override {
        ++checkIns;
        return reply;
    }
    int setStartInterval(std::int64_t seconds) override {
        intervals.push_back(seconds);
        return intervalError;
    }

    bool managed = true;
    Reply reply;
    int checkIns = 0;
    int intervalError = 0;
    std::vector<std::int64_t> intervals;
};

/// A sync that does what the test says. It is that of the process while it lives.
class FakeSync : public Orvane::AutoSync {
 public:
    FakeSync() { setCurrent(this); }
    ~FakeSync() override { setCurrent(nullptr); }

    bool isEnabled() const override { return enabled; }
    bool isSyncing() const override { return syncing; }
    void schedule() override { ++scheduled; }
    double getTimeRemaining() const override { return remaining; }

    bool enabled = true;
    bool syncing = false;
    int scheduled = 0;
    double remaining = std::numeric_limits<double>::infinity();
};

/// A registry that takes the program or does not. It is that of the process while it lives.
class FakeRegistry : public Orvane::TypeRegistry {
 public:
    FakeRegistry() { setCurrent(this); }
    ~FakeRegistry() override { setCurrent(nullptr); }

    bool registerApplication() override {
        ++calls;
        return answer;
    }

    bool answer = true;
    int calls = 0;
};

/// A test of an agent with a storage of its own. Its task is made by the test.
class AgentTest : public StorageTest {
 protected:
    using AgentTask = Orvane::AgentTask;
    using FeedCore = Orvane::FeedCore;

    /// The agent as it is once it has started. What was logged on the way is forgotten.
    void startAgent() {
        task = std::make_unique<AgentTask>();
        task->start(false);
        log.clear();
    }
    /// A stored feed with a subscription in the background; never refreshed by default.
    static FeedCore* subscribe(const char* address, double refreshed = 0, double interval = 0) {
        using namespace Foundation;
        const Ref<String> signature = String::string("org.example.Reader");
        const Ref<Orvane::ClientCore> client = Orvane::ClientCore::createClient(signature);
        const Ref<String> text = String::string(address);
        const Ref<URL> url = URL::url(text);
        const Ref<Orvane::SubscriptionCore> made = client->createSubscription(url, nullptr);
        FeedCore* feed = made->getFeed();
        const Ref<Date> date = Date::date(refreshed);
        feed->mRefreshLocalDate.setValue(date);
        if (interval != 0) made->setRefreshInterval(interval);
        SQLite::gDatabase->saveRows();
        return feed;
    }
    static void post(const Foundation::NotificationName& name, void* object = nullptr,
                     Foundation::Dictionary* info = nullptr) {
        Foundation::NotificationCenter::getLocal()->post(name, object, info);
    }
    /// Turns the loop until the agent ends it; false if nothing ever does.
    bool runUntilQuit() {
        clock.setAdvancesWhenIdle(true);
        const auto result =
            Foundation::RunLoop::current().runInMode(Foundation::RunLoop::kDefaultMode, 1e9, false);
        clock.setAdvancesWhenIdle(false);
        return result == Foundation::RunLoop::Result::Stopped;
    }
    /// The lines of the log that the agent wrote by itself.
    std::vector<std::string> agentLines() const {
        std::vector<std::string> lines;
        for (const std::string& line : log.lines()) {
            if (line.starts_with("[Agent")) lines.push_back(line);
        }
        return lines;
    }

    Support::EnvVar noSystemBus{"DBUS_SYSTEM_BUS_ADDRESS", "unix:path=/nonexistent/bus"};
    Support::LoggingOn logging{{&Orvane::gLogAgent, &Orvane::gLogAgentVerbose, &Orvane::gLogIPC}};
    FakeServiceManager services;
    FakeFeeders feeders;
    std::unique_ptr<AgentTask> task;
};
