// What the agent counts, and what it tells its clients.

#include "Agent/AgentTest.h"
#include "Foundation/Number.h"
#include "Model/EnclosureCore.h"
#include "Model/EnclosureTest.h"

#include <gmock/gmock.h>

using namespace Foundation;
using namespace Orvane;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;
using Strings = std::vector<std::string>;

namespace {

constexpr const char* kStarted = "com.tarnwick.orvane.EnclosureDownloadStarted";
constexpr const char* kEnded = "com.tarnwick.orvane.EnclosureDownloadEnded";

class AgentActivityTest : public AgentTest {
 protected:
    AgentActivityTest() {
        startAgent();
        feed = subscribe("http://example.org/1", clock.now());
        other = subscribe("http://example.org/2", clock.now());
        clock.advanceBy(10);
        log.clear();
        platform.posts.clear();
    }

    void begin(FeedCore* which) { post(FeedCore::kWillRefreshNotification, which); }
    void fetch(FeedCore* which) { post(FeedCore::kBeganUpdateLocalNotification, which); }
    void end(FeedCore* which, Dictionary* info = nullptr) {
        post(FeedCore::kEndedUpdateLocalNotification, which, info);
    }
    /// There is an enclosure that is to be downloaded.
    static void wantDownload() {
        EnclosureCore::_forgetAutoDownloads();
        db().execute(
            "insert into Enclosures (url, downloadAuditStatus, downloadState) values "
            "('http://example.org/file', %i, %i)",
            int{EnclosureCore::kApproved}, int{EnclosureCore::kNoDownload});
    }
    double remaining() const { return task->getQuitTimer().getTimeRemaining(); }
    /// The name and the object of each post that is about feeds.
    Strings told() const {
        Strings result;
        for (const FakeCenter::Post& each : platform.posts) {
            if (each.name.find(".Feed") != std::string::npos) {
                result.push_back(each.name + " " + each.object);
            }
        }
        return result;
    }

    FeedCore* feed;
    FeedCore* other;
};

TEST_F(AgentActivityTest, CountsRefreshes) {
    begin(feed);
    begin(other);
    EXPECT_EQ(task->getRefreshCount(), 2);
    end(feed);
    EXPECT_EQ(task->getRefreshCount(), 1);
    const Strings lines = agentLines();
    ASSERT_THAT(lines, SizeIs(3));
    EXPECT_EQ(lines[0], "[Agent.Verbose] Started refresh of http://example.org/1 (now 1)");
    EXPECT_EQ(lines[1], "[Agent.Verbose] Started refresh of http://example.org/2 (now 2)");
    EXPECT_EQ(
        lines[2],
        OVFormat("[Agent] Ended refresh of http://example.org/1 (status=%@) (1 left)", NetError()));
}

TEST_F(AgentActivityTest, SaysHowARefreshEnded) {
    begin(feed);
    feed->setLastError(NetError(6, 404));
    end(feed);
    EXPECT_TRUE(log.contains(
        OVFormat("Ended refresh of http://example.org/1 (status=%@) (0 left)", NetError(6, 404))));
}

TEST_F(AgentActivityTest, TellsClientsOfFetches) {
    begin(feed);
    EXPECT_THAT(told(), IsEmpty());
    fetch(feed);
    EXPECT_TRUE(log.contains("[Agent.Verbose] Started actual HTTP fetch of http://example.org/1"));
    EXPECT_THAT(told(), ElementsAre(OVFormat("com.tarnwick.orvane.FeedBeganUpdate %lli",
                                             feed->getRowID())));
    EXPECT_EQ(platform.posts.back().info.get(), nullptr);
}

TEST_F(AgentActivityTest, PassesOnHowARefreshEnded) {
    begin(feed);
    const Ref<String> key = String::string("DidChange");
    const Ref<Number> value = Number::number(true);
    const Ref<Dictionary> info = DictionaryOf<String, Number>::dictionary({{key, value}});
    end(feed, info);
    EXPECT_THAT(told(), ElementsAre(OVFormat("com.tarnwick.orvane.FeedEndedUpdate %lli",
                                             feed->getRowID())));
    EXPECT_EQ(platform.posts.back().info.get(), info.get());
}

TEST_F(AgentActivityTest, LeavesFeedsInMemoryAlone) {
    const Ref<FeedCore> free = Returner<FeedCore>::adopted(new FeedCore);
    begin(free);
    fetch(free);
    EXPECT_EQ(task->getRefreshCount(), 0);
    end(free);
    EXPECT_EQ(task->getRefreshCount(), 0);
    EXPECT_THAT(told(), IsEmpty());
    EXPECT_THAT(agentLines(), IsEmpty());
}

TEST_F(AgentActivityTest, WaitsTwoMinutesMoreWhenTheLastRefreshEnds) {
    begin(feed);
    begin(other);
    end(feed);
    EXPECT_LT(remaining(), 15);
    EXPECT_FALSE(log.contains("SCHEDULING REFRESH"));
    log.clear();
    end(other);
    EXPECT_EQ(remaining(), 120.0);
    // And looks what is next.
    const Strings lines = agentLines();
    ASSERT_GE(lines.size(), 3u);
    EXPECT_EQ(lines[1], "[Agent] Agent will quit after 120 seconds of inactivity.");
    EXPECT_EQ(lines[2], "[Agent] ===== SCHEDULING REFRESH =====");
}

TEST_F(AgentActivityTest, LooksForDownloadsWhenTheLastRefreshEnds) {
    FakeDownloaders downloaders;
    begin(feed);
    begin(other);
    wantDownload();
    end(feed);
    EXPECT_EQ(downloaders.calls, "");
    end(other);
    EXPECT_EQ(downloaders.calls, "make(1) start ");
}

TEST_F(AgentActivityTest, GoesOnToTheNextDownloadBeforeItThinksOfTheEnd) {
    FakeDownloaders downloaders;
    const double before = remaining();
    platform.deliver(kStarted, "7", nullptr);
    wantDownload();
    platform.deliver(kEnded, "7", nullptr);
    EXPECT_EQ(downloaders.calls, "make(1) start ");
    EXPECT_EQ(remaining(), before);
}

TEST_F(AgentActivityTest, SavesWhenADownloadBeginsAndWhenItEnds) {
    for (const char* name : {kStarted, kEnded}) {
        feed->mTitle.setValue(String::string(name));
        platform.deliver(name, "1", nullptr);
        EXPECT_FALSE(feed->isChanged()) << name;
    }
}

TEST_F(AgentActivityTest, CountsDownloads) {
    platform.deliver(kStarted, "1", nullptr);
    platform.deliver(kStarted, "2", nullptr);
    EXPECT_EQ(task->getDownloadCount(), 2);
    platform.deliver(kEnded, "1", nullptr);
    EXPECT_EQ(task->getDownloadCount(), 1);
    EXPECT_LT(remaining(), 15);
    platform.deliver(kEnded, "2", nullptr);
    EXPECT_EQ(task->getDownloadCount(), 0);
    EXPECT_EQ(remaining(), 120.0);
}

TEST_F(AgentActivityTest, TakesEveryCallForActivity) {
    post(NotificationNames::kCallHandled);
    EXPECT_EQ(remaining(), 120.0);
    EXPECT_THAT(agentLines(),
                ElementsAre("[Agent] Agent will quit after 120 seconds of inactivity."));
}

}  // namespace
