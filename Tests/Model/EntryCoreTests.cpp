#include "Model/EntryCore.h"

#include "Foundation/AssertionFailure.h"
#include "Model/AuthorCore.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryTest.h"

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

class EntryCoreTest : public EntryTest {
 protected:
    /// The identifier of an entry of the feed that has nothing but this.
    std::string identifierWith(const char* id, const char* page, const char* title,
                               const char* content, const char* summary) {
        const Ref<EntryCore> entry = newEntry();
        if (id) entry->mID.setValue(str(id));
        if (page) entry->mAlternateURL.setValue(url(page));
        if (title) entry->mTitle.setValue(str(title));
        if (content) entry->setContentColumn("content", str("text/plain"), bytes(content));
        if (summary) entry->setContentColumn("summary", str("text/plain"), bytes(summary));
        return textOf(entry->computeIdentifier());
    }
    std::string hashWithFeed(const std::string& material) { return sha1(feedHash + material); }
};

}  // namespace

TEST_F(EntryCoreTest, IdentifiesAnEntryByFeedAndIDWithNothingBetweenThem) {
    EXPECT_EQ(identifierWith("abc", "http://e.org/p", "title", "content", "summary"),
              hashWithFeed("abc"));
}

TEST_F(EntryCoreTest, FallsBackInOrderToIdentifyAnEntry) {
    EXPECT_EQ(identifierWith("", "http://e.org/p", "title", "content", "summary"),
              hashWithFeed("http://e.org/p"));
    EXPECT_EQ(identifierWith(nullptr, nullptr, "title", "content", "summary"),
              hashWithFeed("title"));
    EXPECT_EQ(identifierWith(nullptr, nullptr, "", "content", "summary"), hashWithFeed("content"));
    EXPECT_EQ(identifierWith(nullptr, nullptr, "", "", "summary"), hashWithFeed("summary"));
    EXPECT_EQ(identifierWith(nullptr, nullptr, "", nullptr, "summary"), hashWithFeed("summary"));
    EXPECT_EQ(identifierWith(nullptr, nullptr, "", nullptr, nullptr), hashWithFeed(""));
}

TEST_F(EntryCoreTest, CannotBeIdentifiedWithoutAFeed) {
    const Ref<EntryCore> entry = make<EntryCore>();
    entry->mID.setValue(str("abc"));
    EXPECT_EQ(textOf(entry->computeIdentifier()), "(null)");
    EXPECT_THROW(entry->getIdentifier(), AssertionFailure);
}

TEST_F(EntryCoreTest, KeepsItsIdentifier) {
    const Ref<EntryCore> entry = newEntry("abc");
    EXPECT_EQ(textOf(entry->getIdentifier()), hashWithFeed("abc"));
    entry->mID.setValue(str("other"));
    EXPECT_EQ(textOf(entry->getIdentifier()), hashWithFeed("abc"));
    EXPECT_EQ(textOf(entry->mIdentifier), hashWithFeed("abc"));
}

TEST_F(EntryCoreTest, OnlyComputesTheIdentifierWhereItMayNotBeKept) {
    const Ref<EntryCore> entry = newEntry("abc");
    entry->saveChanges();
    db().saveRows();
    const RowID rowID = entry->getRowID();
    reopen(false);
    const Ref<EntryCore> read = EntryCore::getRow(rowID);
    EXPECT_EQ(textOf(read->getIdentifier()), hashWithFeed("abc"));
    EXPECT_EQ(textOf(read->mIdentifier), "(null)");
}

TEST_F(EntryCoreTest, AssertsItsIdentifier) {
    const Ref<EntryCore> entry = newEntry("abc");
    entry->assertIdentifier(str(hashWithFeed("abc")), "other");
    try {
        entry->assertIdentifier(str("123"), "other");
        FAIL();
    } catch (const AssertionFailure& failure) {
        EXPECT_EQ(std::string(failure.what()), "Identifier mismatch: " + textOf(entry->toString()) +
                                                   " has '" + hashWithFeed("abc") +
                                                   "', other has '123'");
    }
}

TEST_F(EntryCoreTest, FindsAStoredEntryByItsIdentifier) {
    const Ref<EntryCore> entry = newEntry("abc");
    entry->getIdentifier();
    entry->saveChanges();
    const Ref<EntryCore> found = EntryCore::getEntryWithIdentifier(str(hashWithFeed("abc")));
    EXPECT_EQ(found.get(), entry.get());
    const Ref<EntryCore> none = EntryCore::getEntryWithIdentifier(str("nobody's"));
    EXPECT_EQ(none.get(), nullptr);
    EXPECT_THROW(EntryCore::getEntryWithIdentifier(nullptr), AssertionFailure);
}

TEST_F(EntryCoreTest, AGhostHasItsIdentifierAndIsCurrentFromNow) {
    const Ref<EntryCore> ghost = EntryCore::createGhostEntry(str("0123"));
    EXPECT_EQ(ghost->getTable(), nullptr);
    EXPECT_EQ(textOf(ghost->getIdentifier()), "0123");
    EXPECT_TRUE(ghost->mCurrent.getValue());
    EXPECT_EQ(ghost->mLocalDateCreated.getValue()->getAbsoluteTime(), clock.now());
    EXPECT_EQ(ghost->getFeed(), nullptr);
    EXPECT_FALSE(ghost->mRead.getValue());
}

TEST_F(EntryCoreTest, CopiesAContent) {
    const Ref<EntryCore> entry = newEntry();
    const Ref<ContentCore> content = make<ContentCore>();
    content->mMIMEType.setValue(str("text/html"));
    content->mData.setValue(bytes("<p>a</p>"));
    entry->setContent(content.get());
    ASSERT_NE(entry->getContent(), nullptr);
    EXPECT_NE(entry->getContent(), content.get());
    EXPECT_TRUE(IsContentEqual(entry->getContent(), content));
}

TEST_F(EntryCoreTest, SetsAContentByName) {
    const Ref<EntryCore> entry = newEntry();
    entry->setContentColumn("content", str("text/plain"), bytes("1"));
    entry->setContentColumn("summary", str("text/html"), bytes("2"));
    entry->setContentColumn("XMLRepresentation", nullptr, bytes("3"));
    EXPECT_EQ(textOf(entry->getContent()->getData()), "1");
    EXPECT_EQ(textOf(entry->getSummary()->getData()), "2");
    EXPECT_EQ(textOf(entry->getSummary()->mMIMEType), "text/html");
    EXPECT_EQ(textOf(entry->getXMLRepresentation()->getData()), "3");
    entry->setContentColumn("summary", str("text/html"), nullptr);
    EXPECT_EQ(entry->getSummary(), nullptr);
}

TEST_F(EntryCoreTest, KnowsNoOtherContents) {
    const Ref<EntryCore> entry = newEntry();
    try {
        entry->setContentColumn("xmlRepresentation", nullptr, bytes("3"));
        FAIL();
    } catch (const AssertionFailure& failure) {
        EXPECT_STREQ(failure.what(), "Unknown columnName 'xmlRepresentation'");
    }
}

TEST_F(EntryCoreTest, KeepsItsRowOfContentsForLife) {
    const Ref<EntryCore> entry = newEntry();
    entry->setContentColumn("content", str("text/plain"), bytes("1"));
    entry->saveChanges();
    const RowID rowID = entry->getContent()->getRowID();
    EXPECT_GT(rowID, 0);
    entry->setContentColumn("content", str("text/html"), bytes("2"));
    EXPECT_TRUE(entry->isChanged());
    db().saveRows();
    EXPECT_EQ(entry->getContent()->getRowID(), rowID);
    EXPECT_EQ(count("Contents where cast(data as text)='2' and mimeType='text/html'"), 1);
    EXPECT_EQ(count("Contents"), 1);
}

TEST_F(EntryCoreTest, DeletesItsRowOfContentsWithItsLastText) {
    const Ref<EntryCore> entry = newEntry();
    entry->setContentColumn("content", str("text/plain"), bytes("1"));
    entry->saveChanges();
    entry->setContent(nullptr);
    db().saveRows();
    EXPECT_EQ(count("Contents"), 0);
    EXPECT_EQ(count("Entries where content=0"), 1);
}

TEST_F(EntryCoreTest, AnEqualContentChangesNothing) {
    const Ref<EntryCore> entry = newEntry();
    entry->setContentColumn("content", str("text/plain"), bytes("1"));
    entry->saveChanges();
    entry->setContentColumn("content", str("text/plain"), bytes("1"));
    entry->setContentColumn("summary", str("text/plain"), nullptr);
    EXPECT_FALSE(entry->isChanged());
    EXPECT_FALSE(entry->getContent()->isChanged());
}

TEST_F(EntryCoreTest, HashesItsContentsOnceAndKeepsThat) {
    const Ref<EntryCore> entry = newEntry();
    EXPECT_EQ(textOf(entry->getContentHash()), "(null)");
    entry->setContentColumn("content", nullptr, bytes("1"));
    entry->setContentColumn("summary", nullptr, bytes("2"));
    entry->setContentColumn("XMLRepresentation", nullptr, bytes("3"));
    EXPECT_EQ(textOf(entry->mContentHash), "(null)");
    EXPECT_EQ(textOf(entry->getContentHash()), sha1("1"));
    EXPECT_EQ(textOf(entry->getSummaryHash()), sha1("2"));
    EXPECT_EQ(textOf(entry->getXMLRepresentationHash()), sha1("3"));
    EXPECT_EQ(textOf(entry->mContentHash), sha1("1"));
    EXPECT_EQ(textOf(entry->mSummaryHash), sha1("2"));
    EXPECT_EQ(textOf(entry->mXMLRepresentationHash), sha1("3"));
}

TEST_F(EntryCoreTest, OnlyComputesAHashWhereItMayNotBeKept) {
    const Ref<EntryCore> entry = newEntry();
    entry->setContentColumn("content", nullptr, bytes("1"));
    entry->saveChanges();
    const RowID rowID = entry->getRowID();
    reopen(false);
    const Ref<EntryCore> read = EntryCore::getRow(rowID);
    EXPECT_EQ(textOf(read->getContentHash()), sha1("1"));
    EXPECT_EQ(textOf(read->mContentHash), "(null)");
}

TEST_F(EntryCoreTest, TakesOneAuthor) {
    const LogCapture log;
    const LoggingOn on({&gLogSub});
    const Ref<EntryCore> entry = newEntry();
    const Ref<AuthorCore> ann = author("Ann");
    entry->addToAuthors(nullptr);
    entry->addToAuthors(make<AuthorCore>());
    EXPECT_EQ(entry->getAuthor(), nullptr);
    entry->addToAuthors(ann.get());
    entry->addToAuthors(author("Ann"));
    EXPECT_FALSE(log.contains("Multiple authors"));
    entry->addToAuthors(author("Bob"));
    EXPECT_EQ(log.count("[Sub]     EntryCore: Multiple authors not supported yet (ignoring "
                        "subsequent ones)"),
              1);
    entry->addToContributors(author("Cleo"));
    EXPECT_EQ(log.count("Multiple authors"), 2);
    EXPECT_EQ(entry->getAuthor(), ann.get());
}

TEST_F(EntryCoreTest, AContributorIsAnAuthorWhereThereIsNone) {
    const Ref<EntryCore> entry = newEntry();
    entry->addToContributors(author("Ann"));
    EXPECT_EQ(textOf(entry->getAuthor()->mName), "Ann");
}

TEST_F(EntryCoreTest, ListsItsAuthorAndNoContributors) {
    const Ref<EntryCore> entry = newEntry();
    EXPECT_FALSE(entry->getAuthors(nullptr).hasRow());
    entry->addToAuthors(author("Ann"));
    RowIterator<AuthorCore> authors = entry->getAuthors(nullptr);
    EXPECT_FALSE(authors.hasCursor());
    EXPECT_EQ(authors.getRow(), entry->getAuthor());
    EXPECT_FALSE(authors.nextRow());
    EXPECT_FALSE(entry->getContributors(nullptr).hasRow());
}

TEST_F(EntryCoreTest, TakesTheFirstDefaultAuthorWhereItHasNone) {
    const Ref<AuthorCore> ann = author("Ann");
    const Ref<AuthorCore> bob = author("Bob");
    const Ref<ArrayOf<AuthorCore>> both = ArrayOf<AuthorCore>::array({ann.get(), bob.get()});
    const Ref<ArrayOf<AuthorCore>> none = ArrayOf<AuthorCore>::array();
    const Ref<EntryCore> entry = newEntry();
    entry->useDefaultAuthors(nullptr, both.get());
    entry->useDefaultAuthors(none.get(), nullptr);
    EXPECT_EQ(entry->getAuthor(), nullptr);
    entry->useDefaultAuthors(both.get(), nullptr);
    EXPECT_EQ(entry->getAuthor(), ann.get());
    const Ref<ArrayOf<AuthorCore>> second = ArrayOf<AuthorCore>::array({bob.get()});
    entry->useDefaultAuthors(second.get(), nullptr);
    EXPECT_EQ(entry->getAuthor(), ann.get());
}

TEST_F(EntryCoreTest, FillsInTheDateOfPublication) {
    const Ref<TimeZone> berlin = TimeZone::fixedZone(3600);
    const Ref<TimeZone> tokyo = TimeZone::fixedZone(32400);
    const Ref<EntryCore> entry = newEntry();
    entry->useDefaultTimePublished(date(100), nullptr);
    entry->useDefaultTimePublished(date(200), berlin.get());
    entry->useDefaultTimePublished(nullptr, tokyo.get());
    EXPECT_EQ(Date::getAbsoluteTime(entry->mDatePublished), 100);
    EXPECT_TRUE(IsEqual(entry->mTimeZonePublished.getValue(), berlin.get()));
}

TEST_F(EntryCoreTest, ShowsTheBestDateThatItHas) {
    const Ref<EntryCore> entry = newEntry();
    EXPECT_EQ(entry->getDateForDisplay(), nullptr);
    entry->mLocalDateCreated.setValue(date(1));
    EXPECT_EQ(Date::getAbsoluteTime(entry->getDateForDisplay()), 1);
    entry->mDateUpdated.setValue(date(2));
    EXPECT_EQ(Date::getAbsoluteTime(entry->getDateForDisplay()), 2);
    entry->mDatePublished.setValue(date(3));
    EXPECT_EQ(Date::getAbsoluteTime(entry->getDateForDisplay()), 3);
}

TEST_F(EntryCoreTest, SortsByItsRowOrElseByItsPlace) {
    const Ref<EntryCore> entry = newEntry();
    entry->mSortValue = 7;
    EXPECT_EQ(entry->getSortValue(), 7u);
    entry->saveChanges();
    EXPECT_EQ(entry->getSortValue(), 1u);
}

TEST_F(EntryCoreTest, MovesFromFeedToFeed) {
    const Ref<FeedCore> other = newFeed("http://e.org/other");
    const Ref<EntryCore> entry = newEntry();
    EXPECT_EQ(feed->mEntries.getNewRows().size(), 1u);
    entry->setFeed(other.get());
    EXPECT_TRUE(feed->mEntries.getNewRows().empty());
    EXPECT_EQ(other->mEntries.getNewRows().size(), 1u);
    EXPECT_EQ(entry->getFeed(), other.get());
    entry->setFeed(nullptr);
    EXPECT_TRUE(other->mEntries.getNewRows().empty());
    EXPECT_EQ(entry->getFeed(), nullptr);
}

TEST_F(EntryCoreTest, LeavesTheFeedsNewEntriesWhenItIsSaved) {
    const Ref<EntryCore> entry = newEntry();
    const Ref<EntryCore> second = newEntry();
    entry->saveChanges();
    ASSERT_EQ(feed->mEntries.getNewRows().size(), 1u);
    EXPECT_EQ(feed->mEntries.getNewRows()[0].get(), second.get());
    EXPECT_EQ(count("Entries where feed=1"), 1);
}

TEST_F(EntryCoreTest, ComesBackToTheFeedsNewEntriesInOrderIfItsSaveIsUndone) {
    const Ref<EntryCore> first = newEntry("1");
    const Ref<EntryCore> second = newEntry("2");
    const Ref<EntryCore> third = newEntry("3");
    try {
        const Transaction transaction(true);
        first->saveChanges();
        second->saveChanges();
        throw std::runtime_error("undone");
    } catch (const std::runtime_error&) {
        // What is left is looked at below.
    }
    const auto& rows = feed->mEntries.getNewRows();
    ASSERT_EQ(rows.size(), 3u);
    EXPECT_EQ(rows[0].get(), first.get());
    EXPECT_EQ(rows[1].get(), second.get());
    EXPECT_EQ(rows[2].get(), third.get());
    feed->saveChanges();
    EXPECT_EQ(count("Entries where feed=1"), 3);
}

TEST_F(EntryCoreTest, ListsStoredAndNewEnclosures) {
    const Ref<EntryCore> entry = newEntry();
    const Ref<EnclosureCore> stored = make<EnclosureCore>();
    stored->mURL.setValue(url("http://e.org/1"));
    entry->addToEnclosures(stored.get());
    EXPECT_EQ(stored->getEntry(), entry.get());
    entry->saveChanges();
    const Ref<EnclosureCore> added = make<EnclosureCore>();
    added->mURL.setValue(url("http://e.org/2"));
    entry->addToEnclosures(added.get());
    RowIterator<EnclosureCore> enclosures = entry->getEnclosures(nullptr);
    EXPECT_EQ(enclosures.getRow(), stored.get());
    ASSERT_TRUE(enclosures.nextRow());
    EXPECT_EQ(enclosures.getRow(), added.get());
    entry->removeFromEnclosures(added.get());
    EXPECT_EQ(added->getEntry(), nullptr);
    EXPECT_TRUE(entry->getEnclosures("url='http://e.org/1'").hasRow());
    EXPECT_FALSE(entry->getEnclosures("url='http://e.org/2'").hasRow());
}

TEST_F(EntryCoreTest, AsksTheAgentForAContentAndReadsItAnew) {
    const Ref<EntryCore> entry = newEntry();
    entry->setContentColumn("content", nullptr, bytes("1"));
    entry->saveChanges();
    reopen(false);
    RecordingAgent agent;
    const Ref<EntryCore> read = EntryCore::getRow(1);
    read->setContentColumn("content", nullptr, bytes("1"));
    EXPECT_EQ(agent.calls, "");
    read->setContentColumn("content", nullptr, bytes("2"));
    EXPECT_FALSE(read->mContent.isLoaded());
    read->setSummary(nullptr);
    read->setContentColumn("XMLRepresentation", nullptr, bytes("3"));
    read->setContent(nullptr);
    EXPECT_EQ(agent.calls,
              "setContent(1,content,2) setContent(1,XMLRepresentation,3) "
              "setContent(1,content,null) ");
    EXPECT_EQ(textOf(read->getContent()->getData()), "1");
}

TEST_F(EntryCoreTest, AsksTheAgentForAnAuthorThatItHasMade) {
    const Ref<EntryCore> entry = newEntry();
    entry->saveChanges();
    author("Ann")->saveChanges();
    reopen(false);
    RecordingAgent agent;
    const LogCapture log;
    const Ref<EntryCore> read = EntryCore::getRow(1);
    EXPECT_TRUE(read->public_setAuthor(author("Ann")));
    EXPECT_EQ(agent.calls, "setAuthor(1,1) ");
    EXPECT_FALSE(read->mAuthor.isLoaded());
    EXPECT_TRUE(read->public_setAuthor(nullptr));
    EXPECT_EQ(agent.calls, "setAuthor(1,1) setAuthor(1,0) ");
    EXPECT_FALSE(log.contains("Couldn't"));
    agent.calls.clear();
    EXPECT_FALSE(read->public_setAuthor(author("Bob")));
    EXPECT_TRUE(log.contains("[WARNING] Couldn't add author to database"));
    EXPECT_EQ(agent.calls, "createAuthor(Bob,(null),(null),(null)) ");
}

TEST_F(EntryCoreTest, SetsItsAuthorWhereItMayBeChanged) {
    RecordingAgent agent;
    const Ref<EntryCore> entry = newEntry();
    const Ref<AuthorCore> ann = author("Ann");
    EXPECT_TRUE(entry->public_setAuthor(ann.get()));
    EXPECT_EQ(entry->getAuthor(), ann.get());
    EXPECT_EQ(agent.calls, "");
    EXPECT_EQ(count("Authors"), 0);
}

TEST_F(EntryCoreTest, LosesAFeedThatEndsAndWithItItsIdentity) {
    const Ref<EntryCore> entry = make<EntryCore>();
    {
        const AutoreleasePool inner;
        const Ref<FeedCore> ending = newFeed("http://e.org/ending");
        ending->addToEntries(entry.get());
        EXPECT_EQ(entry->getFeed(), ending.get());
    }
    EXPECT_EQ(entry->getFeed(), nullptr);
    EXPECT_EQ(textOf(entry->computeIdentifier()), "(null)");
}

TEST_F(EntryCoreTest, HasNoFeedWhereTheFileHasLostIt) {
    const Ref<EntryCore> entry = storedEntry("abc");
    const Ref<EntryCore> archived = storedEntry("def");
    archived->mCurrent.setValue(false);
    db().saveRows();
    db().execute("delete from Feeds");
    auto* feeds = TableOf<FeedCore>::instance();
    feeds->uncacheRows();
    entry->unload();
    EXPECT_EQ(entry->getFeed(), nullptr);
    EXPECT_EQ(textOf(entry->computeIdentifier()), "(null)");
    EXPECT_EQ(textOf(entry->getIdentifier()), hashWithFeed("abc"));
    entry->setRead(true);
    entry->saveChanges();
    archived->deleteRow();
    EXPECT_EQ(count("Entries where read=1"), 1);
    EXPECT_EQ(count("Entries"), 1);
    // Nor does its table keep one that is not there.
    EXPECT_EQ(feeds->getCachedRowCount(), 0u);
}

TEST_F(EntryCoreTest, MayLeaveWhatAloneKeepsIt) {
    const AutoreleasePool inner;
    EntryCore* entry = nullptr;
    EnclosureCore* attached = nullptr;
    {
        const AutoreleasePool innermost;
        entry = newEntry();
        attached = make<EnclosureCore>();
        entry->addToEnclosures(attached);
    }
    attached->setEntry(nullptr);
    entry->setFeed(nullptr);
    EXPECT_TRUE(feed->mEntries.getNewRows().empty());
}
