#include "Net/Feeder.h"

#include "Foundation/NetworkConfig.h"
#include "Net/FeederTest.h"

using namespace Foundation;
using namespace Orvane;

namespace {

constexpr NetError kUnreachable(NetError::kPFURL, -1004);

void postCancel() {
    NotificationCenter::getLocal()->post(NotificationNames::kCancelBackgroundRefreshes, nullptr,
                                         nullptr);
}

}  // namespace

TEST_F(FeederTest, JoinsARefreshThatRuns) {
    feed->mRefreshETag.setValue(string("\"1\""));
    EXPECT_TRUE(feeder->refresh(false, false));
    EXPECT_TRUE(feeder->isRefreshing());
    EXPECT_TRUE(feeder->refresh(true, true));
    turn();
    ASSERT_EQ(network().pending().size(), 1U);
    network().pending().front()->answer(document(rss("A")));
    turn();
    EXPECT_EQ(network().asked().size(), 1U);
    EXPECT_EQ(sent("If-None-Match"), "\"1\"");
    EXPECT_EQ(recorder->notes, "fetching started ended ");
    EXPECT_FALSE(feeder->isRefreshing());
}

TEST_F(FeederTest, ForgetsTheLastRefreshWhenTheNextBegins) {
    EXPECT_EQ(refresh({404}), "4 404");
    EXPECT_EQ(refresh(document(rss("A"))), "changed");
    network().answer(kFeed, {304});
    feeder->refresh(false, false);
    EXPECT_FALSE(feeder->hasChanged());
    EXPECT_EQ(feeder->getStatus(), NetError::None);
    EXPECT_EQ(feeder->getLinks(), nullptr);
    turn();
}

TEST_F(FeederTest, StoresTheErrorThatEndedIt) {
    EXPECT_EQ(refresh({404}), "4 404");
    EXPECT_EQ(count("Feeds where lastErrorDomain=4 and lastErrorCode=404"), 1);
    EXPECT_EQ(refresh({304}), "same");
    EXPECT_EQ(count("Feeds where lastErrorCode=0"), 1);
}

TEST_F(FeederTest, SavesANewErrorAtOnceAndAllElseSoon) {
    EXPECT_EQ(refresh({304}), "same");
    EXPECT_TRUE(feed->isChanged());
    clock.advanceBy(5);
    EXPECT_FALSE(feed->isChanged());
    EXPECT_EQ(refresh({404}), "4 404");
    EXPECT_FALSE(feed->isChanged());
}

TEST_F(FeederTest, KeepsWhatTheServerSaidWhenTheNetworkIsDown) {
    ASSERT_TRUE(NetworkConfig::isConfigError(kUnreachable));
    EXPECT_EQ(refresh({404}), "4 404");
    EXPECT_EQ(refreshAndFail(kUnreachable), "15 -1004");
    EXPECT_EQ(feed->getLastError(), NetError(NetError::kHTTP, 404));
    EXPECT_EQ(refresh({304}), "same");
    EXPECT_EQ(refreshAndFail(kUnreachable), "15 -1004");
    EXPECT_EQ(feed->getLastError(), kUnreachable);
    EXPECT_EQ(refreshAndFail({NetError::kPFURL, -1003}), "15 -1003");
    EXPECT_EQ(feed->getLastError(), NetError(NetError::kPFURL, -1003));
    EXPECT_EQ(refresh({500}), "4 500");
    EXPECT_EQ(feed->getLastError(), NetError(NetError::kHTTP, 500));
}

TEST_F(FeederTest, EndsAlsoWhenTheFeedCannotBeSaved) {
    db().execute(
        "create trigger Refuse before update on Feeds begin select raise(abort, 'refused'); end");
    EXPECT_EQ(refresh({404}), "4 404");
    EXPECT_EQ(recorder->ends, 1);
    EXPECT_FALSE(feeder->isRefreshing());
    EXPECT_EQ(log.count("void Orvane::Feeder::endedRefresh(NetError)"), 1);
    db().execute("drop trigger Refuse");
    db().saveRows();
    EXPECT_EQ(count("Feeds where lastErrorCode=404"), 1);
}

TEST_F(FeederTest, CancelsBackgroundRefreshesOnRequest) {
    feeder->refresh(false, true);
    turn();
    ASSERT_EQ(network().pending().size(), 1U);
    postCancel();
    EXPECT_EQ(network().pending().size(), 0U);
    EXPECT_EQ(recorder->notes, "fetching started ended ");
    EXPECT_EQ(result(), "same");
    EXPECT_TRUE(RequestQueue::networkQueue().requests().empty());
    postCancel();
    EXPECT_EQ(recorder->ends, 1);
}

TEST_F(FeederTest, LeavesForegroundRefreshesAlone) {
    feeder->refresh(false, false);
    turn();
    postCancel();
    EXPECT_EQ(network().pending().size(), 1U);
    EXPECT_TRUE(feeder->isRefreshing());
    EXPECT_EQ(recorder->ends, 0);
}

TEST_F(FeederTest, FetchesAnewWhatWasCancelledBeforeItWasParsed) {
    feed->mRefreshETag.setValue(string("\"old\""));
    feeder->refresh(false, true);
    turn();
    Answer answer = document(rss("A"));
    answer.headers.push_back({"ETag", "\"new\""});
    network().pending().front()->sendHead(200, answer.headers);
    network().pending().front()->sendBody(answer.body);
    network().pending().front()->end();
    ASSERT_EQ(text(feed->mRefreshETag), "\"new\"");
    postCancel();
    turn();
    EXPECT_EQ(text(feed->mRefreshETag), "\"old\"");
    EXPECT_EQ(text(feed->mTitle), "null");
    EXPECT_EQ(recorder->ends, 1);
    EXPECT_EQ(refresh(answer), "changed");
}

TEST_F(FeederTest, EndsWithItsFeed) {
    feeder->refresh(false, false);
    turn();
    // The feed's own receivers have gone to the recorder, which hears of the end.
    feed->removeFeeder();
    EXPECT_EQ(network().pending().size(), 0U);
    EXPECT_EQ(recorder->ends, 1);
    EXPECT_EQ(feeder->getFeed(), nullptr);
    EXPECT_EQ(result(), "same");
    EXPECT_FALSE(feeder->refresh(false, false));
    EXPECT_FALSE(feeder->needsRefresh());
    NetError error;
    EXPECT_FALSE(feeder->parseFeed(data(rss("A")), error));
    EXPECT_EQ(error, NetError::None);
}

TEST_F(FeederTest, DoesNotBeginWhereItsFeedEndsAsTheFetchDoes) {
    struct Remover {
        FeedCore& feed;
        void fetching(FeedRefresher*) { feed.removeFeeder(); }
    } remover{*feed};
    const Ref<PollingFeeder> held(feeder);
    held->mFetchStarted.setReceiver(receiver(&remover, &Remover::fetching));
    EXPECT_FALSE(held->refresh(true, false));
    EXPECT_FALSE(held->isRefreshing());
    EXPECT_EQ(recorder->notes, "");
    turn();
    EXPECT_EQ(network().asked().size(), 0U);
}

TEST_F(FeederTest, LogsHowItBeginsAndEnds) {
    const Support::LoggingOn on({&gLogFeed});
    refresh({304});
    const std::string name = text(feed->toString());
    EXPECT_EQ(log.count("[Feed] Starting refresh of " + name), 1);
    EXPECT_EQ(log.count("[Feed] Ending refresh of " + name + " (status=OK, changed=0) refreshing"),
              1);
    EXPECT_EQ(log.count("[Feed] Beginning HTTP fetch of <" + std::string(kFeed) + ">"), 1);
    EXPECT_EQ(log.count("[Feed] Got status 304 for " + name), 1);
    EXPECT_EQ(
        log.count("[Feed] Fetching from <" + std::string(kFeed) + "> [last refreshed (null)]"), 1);
}
