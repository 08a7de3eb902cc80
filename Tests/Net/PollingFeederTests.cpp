#include "Net/PollingFeeder.h"

#include "Foundation/ClockTrust.h"
#include "Model/CredentialStore.h"
#include "Net/FeederTest.h"

using namespace Foundation;
using namespace Orvane;
using Support::LoggingOn;

namespace {

class PollingFeederTest : public FeederTest {
 protected:
    static Answer tagged(const std::string& body, const char* tag) {
        Answer answer = document(body);
        answer.headers.push_back({"ETag", tag});
        answer.headers.push_back({"Last-Modified", "Thu, 01 Jan 2026 00:00:00 GMT"});
        return answer;
    }
    std::string stateOfFetch() const {
        return text(feed->mRefreshHTTPDate) + " " + text(feed->mRefreshETag) + " " +
               text(feed->mRefreshDataHash);
    }
    static EntryCore* entry() { return EntryCore::getRow(1); }
    static constexpr const char* kDate = "Thu, 01 Jan 2026 00:00:00 GMT";
};

/// A store that answers when the test says so. It is the port of the process while it lives.
class SlowCredentials : public CredentialStore {
 public:
    SlowCredentials() { setCurrent(this); }
    ~SlowCredentials() override { setCurrent(nullptr); }

    NetError saveInternetPassword(URL*, String*, String*) override { return {}; }
    void findInternetPassword(URL* url, String* user, PasswordHandler found) override {
        asked += OVFormat("%@ %@ ", url, user);
        handler = std::move(found);
    }

    std::string asked;
    PasswordHandler handler;
};

/// A clock on which every look takes some time.
class TickingClock : public Support::ManualClock {
 public:
    double now() const override { return ManualClock::now() + (mTicks++) * 0.11; }

 private:
    mutable int mTicks = 0;
};

}  // namespace

TEST_F(PollingFeederTest, SupportsHTTPAndFiles) {
    for (const char* address : {"http://a/", "HTTPS://a/", "file:///a"}) {
        EXPECT_TRUE(PollingFeeder::supportsURL(url(address))) << address;
    }
    for (const char* address : {"ftp://a/", "feed://a/", "data:a", "httpx://a"}) {
        EXPECT_FALSE(PollingFeeder::supportsURL(url(address))) << address;
    }
    EXPECT_FALSE(PollingFeeder::supportsURL(nullptr));
}

TEST_F(PollingFeederTest, FetchesParsesAndMerges) {
    EXPECT_EQ(refresh(tagged(rss("A"), "\"1\"")), "changed");
    EXPECT_EQ(recorder->notes, "fetching started ended ");
    EXPECT_EQ(text(feed->mTitle), "A");
    EXPECT_EQ(count("Entries where feed=1 and current and title='One'"), 1);
    EXPECT_EQ(stateOfFetch(),
              std::string(kDate) + " \"1\" " + text(data(rss("A"))->SHA1HashString()));
    EXPECT_EQ(feed->mRefreshLocalDate.getValue()->getAbsoluteTime(), clock.now());
    EXPECT_EQ(text(feed->getXMLData()), rss("A"));
    EXPECT_EQ(text(feed->mRedirectedURL), "null");
    EXPECT_EQ(sent("If-None-Match"), "");
    EXPECT_EQ(sent("If-Modified-Since"), "");
}

TEST_F(PollingFeederTest, HasNothingToDoWhereNothingIsNew) {
    refresh(tagged(rss("A"), "\"1\""));
    const std::string state = stateOfFetch();
    const double before = clock.now();
    clock.advanceBy(100);
    EXPECT_EQ(refresh({304, {{"ETag", "\"2\""}}}), "same");
    EXPECT_EQ(sent("If-None-Match"), "\"1\"");
    EXPECT_EQ(sent("If-Modified-Since"), kDate);
    EXPECT_EQ(stateOfFetch(), state);
    EXPECT_EQ(feeder->getStatus(), NetError::None);
    EXPECT_EQ(feed->mRefreshLocalDate.getValue()->getAbsoluteTime(), before + 100);
}

TEST_F(PollingFeederTest, DoesNotParseTheSameBodyAgain) {
    refresh(document(rss("A")));
    const LoggingOn on({&gLogFeed});
    EXPECT_EQ(refresh(document(rss("A"))), "same");
    const std::string name = text(feed->toString());
    EXPECT_EQ(log.count("[Feed] No change in contents of " + name), 1);
    EXPECT_EQ(log.count("[Feed] Finished parsing " + name), 1);
    EXPECT_EQ(log.count("[Feed] Parsing"), 0);
    EXPECT_EQ(refresh(document(rss("B"))), "same");  // no entry is new
    EXPECT_EQ(log.count("[Feed] Parsing " + name), 1);
    EXPECT_EQ(text(feed->mTitle), "B");
}

TEST_F(PollingFeederTest, ForgetsValidatorsThatAreSentNoMore) {
    refresh(tagged(rss("A"), "\"1\""));
    refresh(document(rss("B")));
    EXPECT_EQ(stateOfFetch(), "null null " + text(data(rss("B"))->SHA1HashString()));
}

TEST_F(PollingFeederTest, ComparesEverythingByForce) {
    refresh(tagged(rss("A"), "\"1\""));
    entry()->mTitle.setValue(string("Mine"));
    entry()->saveChanges();
    feed->mRefreshDataHash.setValue(nullptr);
    EXPECT_EQ(refresh(tagged(rss("A"), "\"1\"")), "same");
    EXPECT_EQ(text(entry()->mTitle), "Mine");
    network().answer(kFeed, tagged(rss("A"), "\"1\""));
    EXPECT_EQ(refreshAsIs(true), "changed");
    EXPECT_EQ(sent("If-None-Match"), "");
    EXPECT_EQ(sent("If-Modified-Since"), "");
    EXPECT_EQ(text(entry()->mTitle), "One");
    // Once.
    EXPECT_EQ(refresh({304}), "same");
    EXPECT_EQ(sent("If-None-Match"), "\"1\"");
}

TEST_F(PollingFeederTest, GoesToThePermanentTargetFromThenOn) {
    network().answer(kFeed, redirect(301, kMoved));
    network().answer(kMoved, document(rss("A")));
    EXPECT_EQ(refreshAsIs(), "changed");
    EXPECT_EQ(text(feed->mRedirectedURL), kMoved);
    EXPECT_EQ(text(feed->mURL), kFeed);
    EXPECT_EQ(refresh({304}, false, kMoved), "same");
    EXPECT_EQ(network().asked().back(), "GET " + std::string(kMoved));
    EXPECT_EQ(text(feed->mRedirectedURL), kMoved);
}

TEST_F(PollingFeederTest, LeavesATemporaryTargetAlone) {
    network().answer(kFeed, redirect(302, "http://other.org/feed"));
    network().answer("http://other.org/feed", document(rss("A")));
    EXPECT_EQ(refreshAsIs(), "changed");
    EXPECT_EQ(text(feed->mRedirectedURL), "null");
    refresh({304});
    EXPECT_EQ(network().asked().back(), "GET " + std::string(kFeed));
}

TEST_F(PollingFeederTest, ResolvesURLsByWhereTheDocumentCameFrom) {
    const std::string body =
        "<feed xmlns='http://www.w3.org/2005/Atom'><title>A</title><link href='page'/>"
        "<entry><id>1</id><title>One</title></entry></feed>";
    network().answer(kFeed, redirect(302, "http://other.org/deep/feed"));
    network().answer("http://other.org/deep/feed", document(body));
    EXPECT_EQ(refreshAsIs(), "changed");
    EXPECT_EQ(text(feed->mAlternateURL), "http://other.org/deep/page");
}

TEST_F(PollingFeederTest, TriesTheOriginalOnceWhereTheTargetFails) {
    const LoggingOn on({&gLogFeed});
    feed->mRedirectedURL.setValue(url(kMoved));
    network().answer(kMoved, {404});
    EXPECT_EQ(refresh(document(rss("A"))), "changed");
    EXPECT_EQ(recorder->notes, "fetching started ended ");
    EXPECT_EQ(log.count("Beginning HTTP fetch of"), 2);
    EXPECT_EQ(text(feed->mRedirectedURL), "null");
    EXPECT_EQ(feed->getLastError(), NetError::None);
}

TEST_F(PollingFeederTest, EndsWhereBothFail) {
    feed->mRedirectedURL.setValue(url(kMoved));
    network().answer(kMoved, {404});
    EXPECT_EQ(refresh({410}), "4 410");
    EXPECT_EQ(network().asked().size(), 2U);
    EXPECT_EQ(text(feed->mRedirectedURL), kMoved);
    EXPECT_EQ(feed->mRefreshLocalDate.getValue()->getAbsoluteTime(), clock.now());
    EXPECT_EQ(recorder->ends, 1);
}

TEST_F(PollingFeederTest, TriesTheOriginalAlsoAfterANetworkError) {
    const LoggingOn on({&gLogFeed});
    feed->mRedirectedURL.setValue(url(kMoved));
    network().answer(kFeed, document(rss("A")));
    EXPECT_EQ(refreshAndFail({NetError::kPFURL, -1003}), "changed");
    EXPECT_EQ(log.count("[Feed] Got network error for " + text(feed->toString())), 1);
}

TEST_F(PollingFeederTest, FindsTheLinksOfAPage) {
    const std::string page =
        "<html><head><title>P</title><link rel='alternate' type='application/rss+xml' "
        "href='/rss'></head><body>Words.</body></html>";
    Answer answer{200, {{"Content-Type", "text/html"}}, page};
    EXPECT_EQ(refresh(answer), "1002 2");
    ASSERT_NE(feeder->getLinks(), nullptr);
    ASSERT_EQ(feeder->getLinks()->count(), 1U);
    for (const HTMLLink* link : *feeder->getLinks()) {
        EXPECT_EQ(text(link->getURL()), "http://example.org/rss");
        EXPECT_EQ(link->getHTMLLinkType(), HTMLLink::kRSSFeed);
    }
    EXPECT_FALSE(feeder->hasChanged());
}

TEST_F(PollingFeederTest, KeepsTheLinksOfAFeed) {
    const std::string link =
        "<atom:link xmlns:atom='http://www.w3.org/2005/Atom' rel='self' href='/self'/>";
    EXPECT_EQ(refresh(document(rss("A", "One", link))), "changed");
    ASSERT_NE(feeder->getLinks(), nullptr);
    EXPECT_GE(feeder->getLinks()->count(), 1U);
}

TEST_F(PollingFeederTest, TakesWhatIsNoDocumentForNoFeed) {
    EXPECT_EQ(refresh(document("no markup")), "1002 2");
    EXPECT_EQ(refresh(document("")), "1002 2");
    EXPECT_EQ(feed->getLastError(), NetError(NetError::kOrvane, OVNotAFeedError));
}

TEST_F(PollingFeederTest, WarnsOfRedirectsThatLeadNowhere) {
    EXPECT_EQ(refresh({300}), "same");
    EXPECT_EQ(log.count("PollingFeeder: unexpected status 300 from <" + std::string(kFeed) + ">"),
              1);
    EXPECT_EQ(recorder->ends, 1);
}

TEST_F(PollingFeederTest, CannotBeginWithAnotherScheme) {
    FeedCore* other = storedFeed("ftp://example.org/feed");
    const Ref<PollingFeeder> unable = feederOf(*other);
    FeederRecorder heard(*unable);
    EXPECT_FALSE(unable->refresh(true, false));
    EXPECT_EQ(unable->getStatus(), NetError(NetError::kPFURL, -11));
    EXPECT_EQ(other->getLastError(), NetError(NetError::kPFURL, -11));
    EXPECT_EQ(heard.notes, "");
    EXPECT_FALSE(unable->isRefreshing());
    EXPECT_EQ(log.count("PollingFeeder: Can't  handle this URL scheme: <ftp://example.org/feed>"),
              1);
}

TEST_F(PollingFeederTest, ReadsFiles) {
    const std::string file = directory.writeFile("feed.xml", rss("A"));
    const std::string address = "file://" + file;
    FeedCore* local = storedFeed(address.c_str());
    const Ref<PollingFeeder> reader = feederOf(*local);
    FeederRecorder heard(*reader);
    EXPECT_TRUE(reader->refresh(false, true));
    EXPECT_EQ(local->mRefreshLocalDate.getValue()->getAbsoluteTime(), clock.now());
    EXPECT_EQ(heard.notes, "started ");
    turn();
    EXPECT_EQ(heard.notes, "started ended ");
    EXPECT_TRUE(reader->hasChanged());
    EXPECT_EQ(text(local->mTitle), "A");
    std::filesystem::remove(file);
    EXPECT_TRUE(reader->refresh(false, true));
    turn();
    EXPECT_EQ(reader->getStatus(), NetError(NetError::kPFURL, -12));
    EXPECT_EQ(heard.ends, 2);
}

TEST_F(PollingFeederTest, IsDueWhenItsIntervalIsOver) {
    ClientCore* client = storedClient("client");
    EXPECT_TRUE(feeder->needsRefresh());
    subscribe(client, feed, 300);
    refresh({304});
    EXPECT_FALSE(feeder->needsRefresh());
    clock.advanceBy(299);
    EXPECT_FALSE(feeder->needsRefresh());
    clock.advanceBy(1);
    EXPECT_TRUE(feeder->needsRefresh());
}

TEST_F(PollingFeederTest, IsDueOnDemandAfterHalfAnHourWhereNobodyWantsIt) {
    refresh({304});
    clock.advanceBy(1799);
    EXPECT_FALSE(feeder->needsRefresh());
    clock.advanceBy(1);
    EXPECT_TRUE(feeder->needsRefresh());
}

TEST_F(PollingFeederTest, IsDueWhereAClockWasWrong) {
    feed->mRefreshLocalDate.setValue(date(clock.now() + ClockTrust::kToleranceSeconds));
    EXPECT_FALSE(feeder->needsRefresh());
    feed->mRefreshLocalDate.setValue(date(clock.now() + ClockTrust::kToleranceSeconds + 1));
    EXPECT_TRUE(feeder->needsRefresh());
}

TEST_F(PollingFeederTest, OffersItsLoginOnce) {
    feed->mLogin.setValue(string("ann"));
    feed->setPassword(string("secret"), false);
    const Answer demand{401, {{"WWW-Authenticate", "Basic realm=\"R\""}}};
    network().answer(kFeed, demand);
    EXPECT_EQ(refresh(document(rss("A"))), "changed");
    EXPECT_EQ(network().asked().size(), 2U);
    ASSERT_NE(network().requests().back().credential.get(), nullptr);
    EXPECT_EQ(text(network().requests().back().credential->getPassword()), "secret");
    EXPECT_EQ(text(feed->mLogin), "ann");
    network().answer(kFeed, demand);
    EXPECT_EQ(refresh(demand), "4 401");
    ASSERT_NE(feeder->getProtectionSpace(), nullptr);
    EXPECT_EQ(text(feeder->getProtectionSpace()->getRealm()), "R");
    EXPECT_EQ(text(feed->mLogin), "ann");
}

TEST_F(PollingFeederTest, OffersItsLoginToItsOwnServerAlone) {
    feed->mLogin.setValue(string("ann"));
    feed->setPassword(string("secret"), false);
    feed->mRedirectedURL.setValue(url("http://other.org/feed"));
    const Answer demand{401, {{"WWW-Authenticate", "Basic realm=\"R\""}}};
    network().answer("http://other.org/feed", demand);
    EXPECT_EQ(refresh({304}), "same");
    EXPECT_EQ(network().asked().size(), 2U);
    for (const auto& request : network().requests()) {
        EXPECT_EQ(request.credential.get(), nullptr);
    }
}

TEST_F(PollingFeederTest, LooksForItsPasswordBeforeItAsks) {
    SlowCredentials store;
    feed->mLogin.setValue(string("ann"));
    feeder->refresh(false, false);
    turn();
    EXPECT_EQ(store.asked, std::string(kFeed) + " ann ");
    EXPECT_TRUE(feeder->isRefreshing());
    EXPECT_EQ(network().asked().size(), 0U);
    network().answer(kFeed, {401, {{"WWW-Authenticate", "Basic realm=\"R\""}}});
    network().answer(kFeed, document(rss("A")));
    store.handler(string("secret"));
    turn();
    EXPECT_EQ(result(), "changed");
    EXPECT_EQ(text(feed->getPassword()), "secret");
    EXPECT_EQ(refresh({304}), "same");
    EXPECT_EQ(store.asked, std::string(kFeed) + " ann ");
}

TEST_F(PollingFeederTest, GoesOnWithoutAPasswordThatIsNotFound) {
    SlowCredentials store;
    feed->mLogin.setValue(string("ann"));
    network().answer(kFeed, {401, {{"WWW-Authenticate", "Basic realm=\"R\""}}});
    feeder->refresh(false, false);
    store.handler(nullptr);
    turn();
    EXPECT_EQ(result(), "4 401");
    EXPECT_EQ(network().asked().size(), 1U);
    EXPECT_EQ(text(feed->mLogin), "ann");
}

TEST_F(PollingFeederTest, LooksForAPasswordAnewThatWasRefused) {
    SlowCredentials store;
    feed->mLogin.setValue(string("ann"));
    const Answer demand{401, {{"WWW-Authenticate", "Basic realm=\"R\""}}};
    network().answer(kFeed, demand);
    network().answer(kFeed, demand);
    feeder->refresh(false, false);
    store.handler(string("old"));
    turn();
    EXPECT_EQ(result(), "4 401");
    EXPECT_EQ(feed->getPassword(), nullptr);
    store.asked.clear();
    feeder->refresh(false, false);
    EXPECT_EQ(store.asked, std::string(kFeed) + " ann ");
    store.handler(nullptr);
}

TEST_F(PollingFeederTest, TakesNoPasswordAfterItsEnd) {
    SlowCredentials store;
    feed->mLogin.setValue(string("ann"));
    feeder->refresh(false, false);
    feeder->removed();
    EXPECT_EQ(recorder->ends, 1);
    store.handler(string("secret"));
    turn();
    EXPECT_EQ(network().asked().size(), 0U);
}

TEST_F(PollingFeederTest, WaitsItsTurnInTheBackground) {
    std::vector<FeedCore*> feeds;
    for (int i = 0; i < 5; ++i) {
        feeds.push_back(storedFeed(("http://host" + std::to_string(i) + "/").c_str()));
        feeds.back()->refresh(false, true);
    }
    turn();
    EXPECT_EQ(network().asked().size(), 4U);
    EXPECT_TRUE(feederOf(*feeds[4])->isRefreshing());
    feeder->refresh(false, false);
    turn();
    EXPECT_EQ(network().asked().back(), "GET " + std::string(kFeed));
    network().pending().front()->answer({304});
    turn();
    EXPECT_EQ(network().asked().back(), "GET http://host4/");
    for (FeedCore* each : feeds) {
        each->removeFeeder();
    }
}

TEST_F(PollingFeederTest, FetchesAgainWhatCouldNotBeMerged) {
    EXPECT_EQ(refresh(tagged(rss("A", "One"), "\"1\"")), "changed");
    const std::string state = stateOfFetch();
    db().execute(
        "create trigger Refuse before insert on Entries begin select raise(abort, 'refused'); end");
    EXPECT_EQ(refresh(tagged(rss("A", "Two"), "\"2\"")), "1002 1");
    EXPECT_EQ(stateOfFetch(), state);
    EXPECT_EQ(log.count("bool Orvane::PollingFeeder::parseFeed(Data *, NetError &)"), 1);
    EXPECT_EQ(feed->getLastError(), NetError(NetError::kOrvane, OVInternalError));
    EXPECT_FALSE(feeder->hasChanged());
    db().execute("drop trigger Refuse");
    EXPECT_EQ(refresh(tagged(rss("A", "Two"), "\"2\"")), "changed");
    EXPECT_EQ(sent("If-None-Match"), "\"1\"");
    EXPECT_EQ(count("Entries where title='Two'"), 1);
}

TEST_F(PollingFeederTest, DoesNotParseWhatHasBroughtTheProcessDownTwice) {
    feed->setXMLData(data("old"));
    const Ref<URL> file = feed->getURLOfXMLFile();
    leaveMarks(file, 2);
    EXPECT_EQ(refresh(tagged(rss("A"), "\"1\"")), "1002 1");
    EXPECT_EQ(stateOfFetch(), "null null null");
    EXPECT_EQ(log.count("Not parsing <" + std::string(kFeed) + ">"), 1);
    clock.advanceBy(86400);
    EXPECT_EQ(refresh(tagged(rss("A"), "\"1\"")), "changed");
    EXPECT_EQ(directory.readFile("Orvane/Feeds/.parsing"), "");
}

TEST_F(PollingFeederTest, MergesWhatSomebodyElseHasFetched) {
    feeder->refreshFromData(data(rss("A")));
    EXPECT_EQ(text(feed->mTitle), "A");
    EXPECT_EQ(feed->getLastError(), NetError::None);
    EXPECT_EQ(recorder->notes, "");
    feeder->refreshFromData(data("nothing"));
    EXPECT_EQ(feed->getLastError(), NetError(NetError::kOrvane, OVNotAFeedError));
    EXPECT_EQ(network().asked().size(), 0U);
}

TEST_F(PollingFeederTest, WarnsOfParsingAndMergingThatTakeLong) {
    const TickingClock slow;
    EXPECT_EQ(refresh(document(rss("A"))), "changed");
    for (const char* what : {"parsing", "merging"}) {
        EXPECT_EQ(log.count("Long work on the run loop: " + std::string(what) + " of <" + kFeed), 1)
            << what;
    }
}

TEST_F(PollingFeederTest, LogsWhatItGets) {
    const LoggingOn on({&gLogFeed});
    const std::string bytes = std::to_string(rss("A").size());
    refresh(document(rss("A")));
    EXPECT_EQ(log.count("[Feed] Got contents (" + bytes + " bytes) of " + text(feed->toString())),
              1);
    FeedCore* local = storedFeed(("file://" + directory.writeFile("f", rss("A"))).c_str());
    const Ref<PollingFeeder> reader = feederOf(*local);
    reader->refresh(false, true);
    turn();
    EXPECT_EQ(log.count("[Feed] Reading contents of <" + text(local->mURL.getValue()) + ">"), 1);
    EXPECT_EQ(log.count("[Feed] Got contents (" + bytes + " bytes) of " + text(local->toString())),
              1);
}

TEST_F(PollingFeederTest, CountsHowManyThereAre) {
    const LoggingOn on({&gLogFeed});
    const int before = PollingFeeder::getObjectCount();
    {
        const AutoreleasePool inner;
        const Ref<FeedCore> other = freeFeed("http://a/");
        other->getFeeder();
        EXPECT_EQ(PollingFeeder::getObjectCount(), before + 1);
        other->removeFeeder();
    }
    EXPECT_EQ(PollingFeeder::getObjectCount(), before);
    ASSERT_FALSE(log.lines().empty());
    const std::string last = log.lines().back();
    EXPECT_EQ(last.find("[Feed] PollingFeeder "), 0U) << last;
    EXPECT_EQ(log.count(OVFormat(" destroyed, %d remain", before)), 1);
}

TEST_F(PollingFeederTest, RefreshesAFeedInMemory) {
    const Ref<FeedCore> free = freeFeed(kMoved);
    const Ref<PollingFeeder> its = feederOf(*free);
    network().answer(kMoved, document(rss("A")));
    EXPECT_TRUE(its->refresh(false, false));
    turn();
    EXPECT_TRUE(its->hasChanged());
    EXPECT_EQ(text(free->mTitle), "A");
    EXPECT_EQ(count("Entries"), 0);
    free->removeFeeder();
}
