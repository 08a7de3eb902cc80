#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "Model/FeedCore.h"
#include "Model/FeedTest.h"

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;
using Support::LoggingOn;

namespace {

class FeedCoreMerge : public FeedTest {
 protected:
    FeedCore* const feed = storedFeed();
    FeedCore* const parsed = freeFeed();
};

}  // namespace

TEST_F(FeedCoreMerge, TakesOverWhatTheDocumentSaysOfTheFeed) {
    parsed->mID.setValue(string("id"));
    parsed->mTitle.setValue(string("title"));
    parsed->mSubtitle.setValue(string("subtitle"));
    parsed->mRights.setValue(string("rights"));
    parsed->mAlternateURL.setValue(url("http://example.org/"));
    parsed->mIconURL.setValue(url("http://example.org/icon"));
    parsed->mLogoURL.setValue(url("http://example.org/logo"));
    parsed->mFeedFormat.setValue(2);
    parsed->mDateUpdated.setValue(date(5000));
    parsed->mLinkLocalGUID.setValue(string("other"));
    EXPECT_TRUE(feed->updateFrom(parsed, false));
    EXPECT_EQ(text(feed->mID), "id");
    EXPECT_EQ(text(feed->mTitle), "title");
    EXPECT_EQ(text(feed->mSubtitle), "subtitle");
    EXPECT_EQ(text(feed->mRights), "rights");
    EXPECT_EQ(text(feed->mAlternateURL), "http://example.org/");
    EXPECT_EQ(text(feed->mIconURL), "http://example.org/icon");
    EXPECT_EQ(text(feed->mLogoURL), "http://example.org/logo");
    EXPECT_EQ(feed->mFeedFormat.getValue(), 2);
    EXPECT_EQ(Date::getAbsoluteTime(feed->mDateUpdated), 5000);
    EXPECT_EQ(Date::getAbsoluteTime(feed->mLocalDateUpdated), clock.now());
    EXPECT_EQ(text(feed->mLinkLocalGUID), "null");
}

TEST_F(FeedCoreMerge, LetsGoOfWhatTheDocumentSaysNoMore) {
    feed->mTitle.setValue(string("old"));
    feed->mDateUpdated.setValue(date(5000));
    EXPECT_TRUE(feed->updateFrom(parsed, false));
    EXPECT_EQ(text(feed->mTitle), "null");
    EXPECT_EQ(feed->mDateUpdated.getValue(), nullptr);
}

TEST_F(FeedCoreMerge, ChangesNothingWhileTheDateOfTheDocumentRemains) {
    const LoggingOn on({&gLogSub});
    parsed->mTitle.setValue(string("one"));
    parsed->mDateUpdated.setValue(date(5000));
    EXPECT_TRUE(feed->updateFrom(parsed, false));
    clock.advanceBy(10);
    feed->saveChanges();
    parsed->mTitle.setValue(string("two"));
    EXPECT_FALSE(feed->updateFrom(parsed, false));
    EXPECT_FALSE(feed->isChanged());
    EXPECT_EQ(text(feed->mTitle), "one");
    EXPECT_EQ(log.count("[Sub] Updating feed <http://example.org/feed>"), 2);
    EXPECT_EQ(log.lines().back().find("[Sub] ...No-op: Feed date remained 2001-01-01 01:23:20"),
              0U);
    EXPECT_TRUE(feed->updateFrom(parsed, true));
    EXPECT_EQ(text(feed->mTitle), "two");
    EXPECT_EQ(Date::getAbsoluteTime(feed->mLocalDateUpdated), clock.now());
}

TEST_F(FeedCoreMerge, TakesADocumentWithoutADateAsANewOne) {
    EXPECT_TRUE(feed->updateFrom(parsed, false));
    EXPECT_TRUE(feed->updateFrom(parsed, false));
}

TEST_F(FeedCoreMerge, KeepsWhereItWasRedirectedTo) {
    const LoggingOn on({&gLogSub});
    parsed->mRedirectedURL.setValue(url("http://example.org/new"));
    feed->updateFrom(parsed, false);
    EXPECT_EQ(text(feed->mRedirectedURL), "http://example.org/new");
    EXPECT_EQ(log.count("[Sub]     ...was redirected to <http://example.org/new>"), 1);
    parsed->mRedirectedURL.setValue(url(kAddress));
    feed->updateFrom(parsed, false);
    EXPECT_EQ(text(feed->mRedirectedURL), "null");
    EXPECT_EQ(log.count("was redirected to"), 1);
}

TEST_F(FeedCoreMerge, RefusesAFeedOfAnotherURL) {
    try {
        feed->updateFrom(freeFeed("http://example.org/other"), false);
        FAIL();
    } catch (const AssertionFailure& failure) {
        EXPECT_STREQ(failure.what(), "url->isEqual(newFeed->getURL())");
    }
}

TEST_F(FeedCoreMerge, RefusesAFeedWithAnotherIdentifier) {
    feed->mLocalDateUpdated.setValue(date(1));
    feed->mURL.setValue(url("http://example.org/moved"));
    FeedCore* moved = freeFeed("http://example.org/moved");
    try {
        feed->updateFrom(moved, true);
        FAIL();
    } catch (const std::runtime_error& error) {
        EXPECT_STREQ(error.what(), "New feed's ID is different from old feed's");
    }
    EXPECT_TRUE(log.contains("FeedCore::updateFrom: newFeed's hash '" +
                             text(moved->getIdentifier()) +
                             "' (for URL <http://example.org/moved>) doesn't match mine '" +
                             kIdentifier + "' (URL <http://example.org/moved>)"));
}

TEST_F(FeedCoreMerge, DoesNotCompareIdentifiersBeforeTheFirstMergeOrInMemory) {
    feed->mURL.setValue(url("http://example.org/moved"));
    EXPECT_TRUE(feed->updateFrom(freeFeed("http://example.org/moved"), false));
    FeedCore* inMemory = freeFeed();
    inMemory->mLocalDateUpdated.setValue(date(1));
    inMemory->mIdentifier.setValue(string("other"));
    EXPECT_TRUE(inMemory->updateFrom(parsed, false));
}

TEST_F(FeedCoreMerge, PutsBackHowFarTheDocumentWasRead) {
    feed->mDateUpdated.setValue(date(1));
    feed->mLocalDateUpdated.setValue(date(2));
    feed->mRefreshHTTPDate.setValue(string("date"));
    feed->mRefreshETag.setValue(string("tag"));
    feed->mRefreshDataHash.setValue(string("hash"));
    const FeedCore::ReadState before = feed->getReadState();
    feed->mRefreshHTTPDate.setValue(nullptr);
    feed->mRefreshETag.setValue(string("new"));
    feed->mRefreshDataHash.setValue(string("new"));
    parsed->mDateUpdated.setValue(date(3));
    feed->updateFrom(parsed, false);
    feed->setReadState(before);
    EXPECT_EQ(Date::getAbsoluteTime(feed->mDateUpdated), 1);
    EXPECT_EQ(Date::getAbsoluteTime(feed->mLocalDateUpdated), 2);
    EXPECT_EQ(text(feed->mRefreshHTTPDate), "date");
    EXPECT_EQ(text(feed->mRefreshETag), "tag");
    EXPECT_EQ(text(feed->mRefreshDataHash), "hash");
}
