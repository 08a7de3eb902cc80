#pragma once

#include "Agent/AgentTest.h"
#include "Foundation/ClockTrust.h"
#include "Foundation/Number.h"
#include "Foundation/PreferenceKeys.h"
#include "Support/DefaultZone.h"
#include "Support/TurnUntil.h"
#include "Utilities/FileUtils.h"

#include <optional>
#include <string>
#include <vector>

/// A log in which a line with a text takes some time to write.
class SlowLog : public Support::LogCapture {
 public:
    SlowLog(Support::ManualClock& clock, std::string text, double seconds)
        : mClock(clock), mText(std::move(text)), mSeconds(seconds) {}
    void write(const Foundation::Logger& logger, std::string_view text) override {
        if (text.find(mText) != std::string_view::npos) mClock.sleep(mSeconds);
        LogCapture::write(logger, text);
    }

 private:
    Support::ManualClock& mClock;
    const std::string mText;
    const double mSeconds;
};

/// The preferences of the daily run, which are forgotten at the end.
class HygienePreferences {
 public:
    ~HygienePreferences() {
        for (const char* name : {"LastHygieneRun", "HygieneRunInterval", "HygieneBackoffInterval"})
            set(name, std::nullopt);
        forgetKept();
    }
    static void set(const char* name, std::optional<double> value) {
        using Foundation::Number;
        const Foundation::Ref<Number> number =
            value ? Foundation::Ref<Number>(Number::number(*value)) : Foundation::Ref<Number>();
        Foundation::UntypedPref(Orvane::AgentTask::getAgentPrefs(), name) = number.get();
    }
    static double get(const char* name) {
        return static_cast<double>(
            Foundation::UntypedPref(Orvane::AgentTask::getAgentPrefs(), name));
    }
    static void forgetKept() { Orvane::AgentTask::_forgetIntervals(); }
};

/// A test of what the agent does once a day.
class AgentHygieneTest : public AgentTest {
 protected:
    AgentHygieneTest() {
        HygienePreferences::forgetKept();
        Foundation::ClockTrust::setBuildDate(0);
    }
    ~AgentHygieneTest() noexcept override {
        task.reset();
        Foundation::ClockTrust::setBuildDate(mBuildDate);
    }

    void start() {
        startAgent();
        clock.advanceBy(AgentTask::kHoldOffSeconds);
        log.clear();
    }
    double remaining() const { return task->getHygieneTimer().getTimeRemaining(); }

    /// A feed that many clients subscribe to, each with an expiration date. Gives its ID.
    static long long feedExpiring(std::vector<std::optional<double>> dates) {
        const long long id = count("Feeds") + 1;
        db().execute(
            "insert into Feeds (rowID, identifier, url) values (%lld, 'feed%lld', "
            "'http://e.org/%lld')",
            id, id, id);
        for (const auto& date : dates) {
            db().execute("insert into Clients (signature) values ('c%d')", count("Clients"));
            db().execute(
                "insert into Subscriptions (client, feed, refreshInterval, "
                "expirationInterval, expirationDate, unreadCount) values "
                "(last_insert_rowid(), %lld, -1, -1, %s, 0)",
                id, date ? OVFormat("%.1f", *date) : std::string("null"));
        }
        return id;
    }
    /// An entry of the feed, first seen then, with a content, a summary and an enclosure.
    static void entry(long long feed, const char* name, double created, bool current = false,
                      bool flagged = false) {
        const int id = db().execScalar("select ifnull(max(rowID),0)+1 from Entries");
        for (int i = 0; i < 3; ++i)
            db().execute("insert into Contents (rowID) values (%d)", 3 * id + i);
        db().execute(
            "insert into Entries (rowID, identifier, title, feed, localDateCreated, "
            "current, flagged, read, content, summary, xmlRepresentation) values "
            "(%d, '%s', '%s', %lld, %.1f, %d, %d, 0, %d, %d, %d)",
            id, name, name, feed, created, current ? 1 : 0, flagged ? 1 : 0, 3 * id, 3 * id + 1,
            3 * id + 2);
        db().execute("insert into Enclosures (entry, url) values (%d, 'http://e.org/%s')", id,
                     name);
    }
    static std::vector<std::string> titles() {
        return rows("select title from Entries order by rowID");
    }
    /// Makes a file that the check of the whole file finds fault with.
    static void breakIntegrity() {
        db().execute("create table Odd (a check (a > 0))");
        db().execute(
            "PRAGMA ignore_check_constraints = ON; insert into Odd values (-1); "
            "PRAGMA ignore_check_constraints = OFF");
    }
    static void waitForDeletions() {
        ASSERT_TRUE(
            Support::turnUntil([] { return !Orvane::FileUtils::isDeletingFilesAsynchronously(); }));
    }

    const Support::DefaultZone zone{"Europe/Berlin"};
    const Support::EnvVar dontQuit{"OVAgentDontQuit", "1"};
    static constexpr double kDay = 86400;
    HygienePreferences preferences;

 private:
    const double mBuildDate = Foundation::ClockTrust::getBuildDate();
};
