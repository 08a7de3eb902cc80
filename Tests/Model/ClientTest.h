#pragma once

#include "Foundation/Dictionary.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/NotificationRecorder.h"
#include "Foundation/RunningApplications.h"
#include "Model/FeedTest.h"
#include "Model/MinistryOfTruth.h"

#include <functional>
#include <string>

/// A session in which the test says what runs.
class FakeSession : public Foundation::RunningApplications {
 public:
    FakeSession() { setCurrent(this); }
    ~FakeSession() override { setCurrent(nullptr); }
    std::int32_t getSeed() override { return seed; }
    bool isRunning(const std::string& identifier) override { return identifier == running; }
    void run(const char* identifier) {
        running = identifier;
        ++seed;
    }

    std::string running;
    std::int32_t seed = 0;
};

/// An agent that writes down what clients ask, and does what the test says. It is the link of the
/// process while it lives.
class ClientAgent : public Orvane::UnreachableAgent {
 public:
    using ClientCore = Orvane::ClientCore;
    using SubscriptionCore = Orvane::SubscriptionCore;

    ClientAgent() { setCurrent(this); }
    ~ClientAgent() override { setCurrent(nullptr); }

    ClientCore* createClient(String* signature) override {
        note(OVFormat("createClient(%@)", signature));
        return client;
    }
    void markClientInUse(ClientCore* row) override {
        note(OVFormat("markClientInUse(%lli)", row->getRowID()));
    }
    void expireAllEntries(ClientCore* row) override {
        note(OVFormat("expireAllEntries(%lli)", row->getRowID()));
    }
    void setPrivate(ClientCore* row, bool value) override {
        note(OVFormat("setPrivate(%lli,%i)", row->getRowID(), value));
    }
    SubscriptionCore* createSubscription(ClientCore* row, URL* url, Dictionary* settings) override {
        note(OVFormat("createSubscription(%lli,%@,%@)", row->getRowID(), url, settings));
        return subscription;
    }
    void updateSubscription(SubscriptionCore* row, double refresh, double expiration,
                            bool background, bool downloads, double size,
                            Foundation::ArrayOf<String>* types) override {
        note(OVFormat("updateSubscription(%lli,%g,%g,%i,%i,%g,%@)", row->getRowID(), refresh,
                      expiration, background, downloads, size, types));
    }
    NetError refresh(Orvane::FeedCore* feed, bool force) override {
        note(OVFormat("refresh(%lli,%i)", feed->getRowID(), force));
        return {};
    }
    void refreshMultiple(const RowID* feeds, unsigned count, bool force) override {
        std::string list;
        for (unsigned i = 0; i < count; ++i) {
            list += OVFormat("%lli ", feeds[i]);
        }
        note(OVFormat("refreshMultiple(%s,%i)", list, force));
    }

    std::string calls;
    std::function<void()> onCall;
    ClientCore* client = nullptr;
    SubscriptionCore* subscription = nullptr;

 private:
    void note(const std::string& call) {
        calls += call + " ";
        if (onCall) onCall();
    }
};

/// What is announced as a change of the schedule, while this lives.
class Schedule : public NotificationRecorder {
 public:
    Schedule() {
        Foundation::NotificationCenter::getLocal()->addObserver(
            *this, Orvane::SubscriptionCore::kRefreshScheduleChangedNotification, nullptr);
    }
    ~Schedule() { Foundation::NotificationCenter::getLocal()->removeObserver(*this); }
};

/// A test of clients and subscriptions.
class ClientTest : public FeedTest {
 protected:
    using ClientCore = Orvane::ClientCore;
    using EntryCore = Orvane::EntryCore;
    using FeedCore = Orvane::FeedCore;
    using SubscriptionCore = Orvane::SubscriptionCore;

    static constexpr double kDay = 86400;

    ClientTest() { std::filesystem::create_directories(directory.path() / "Orvane"); }
    ~ClientTest() noexcept override {
        // What is left to be saved must not be saved by another test.
        if (db().isOpen()) clock.advanceBy(Orvane::MinistryOfTruth::kSaveDelaySeconds);
    }

    static ClientCore* newClient(const char* signature = "org.example.Reader") {
        return ClientCore::createClient(string(signature));
    }
    static SubscriptionCore* newSubscription(ClientCore* client, FeedCore* feed) {
        return client->createSubscription(feed, nullptr);
    }
    /// A stored entry of the feed, first seen then.
    static EntryCore* newEntry(FeedCore* feed, const char* identifier, double created) {
        auto* entry = row<EntryCore>();
        entry->mIdentifier.setValue(string(identifier));
        entry->mLocalDateCreated.setValue(date(created));
        feed->addToEntries(entry);
        entry->saveChanges();
        return entry;
    }
    /// Lets another connection write, as the agent would.
    void writeElsewhere(const char* sql) const {
        SQLite::Database other;
        other.open(path.c_str(), true);
        other.execute("%s", sql);
    }
    /// From here on the process only reads. What is in memory goes.
    void becomeReader() {
        db().saveRows();
        reopen(false);
    }
    static double time(const Foundation::Date* date) {
        return Foundation::Date::getAbsoluteTime(date);
    }
    static std::string nameOf(const Foundation::NotificationName& name) { return name.text(); }

    FakeSession session;
};
