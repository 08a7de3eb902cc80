#include "Foundation/AssertionFailure.h"
#include "Model/EntryTest.h"

#include <filesystem>

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

class EntryMergeTest : public EntryTest {
 protected:
    /// A document's entry with all that can be merged.
    static Ref<EntryCore> full() {
        Ref<EntryCore> entry = parsed();
        entry->mID.setValue(str("abc"));
        entry->mTitle.setValue(str("Title"));
        entry->mRights.setValue(str("Rights"));
        entry->mAlternateURL.setValue(url("http://e.org/p"));
        entry->mDateCreated.setValue(date(10));
        entry->mDatePublished.setValue(date(20));
        entry->mDateUpdated.setValue(date(30));
        entry->setContentColumn("content", str("text/html"), bytes("<p>content</p>"));
        entry->setContentColumn("summary", str("text/plain"), bytes("summary"));
        entry->setContentColumn("XMLRepresentation", nullptr, bytes("<entry/>"));
        entry->addToAuthors(author("Ann"));
        entry->addToEnclosures(enclosure("http://e.org/a.mp3", "audio/mpeg", 1024));
        return entry;
    }
    /// A stored entry that is as `full` says, from an hour ago.
    Ref<EntryCore> storedFull() {
        Ref<EntryCore> entry = storedEntry("abc");
        entry->updateFrom(full(), true);
        db().saveRows();
        clock.jumpTo(clock.now() + 3600);
        return entry;
    }
    static double time(const ScalarColumn<Date>& column) { return Date::getAbsoluteTime(column); }
    /// Whether a merge has changed the data, or only the source.
    bool hasNewData(const EntryCore& entry) const {
        return time(entry.mLocalDateUpdated) == clock.now();
    }
    bool hasNewSource(const EntryCore& entry) const {
        return time(entry.mLocalDateXMLChanged) == clock.now();
    }
    std::string entryFile(const EntryCore& entry) const {
        return directory /
               ("Orvane/Feeds/" + feedHash + "/" + textOf(entry.getIdentifier()) + ".xml");
    }
    /// Puts the entry's file into the archive.
    void archive(EntryCore& entry) {
        feed->getURLOfEntryXMLDir(true);
        feed->saveEntryToFile(entry.getIdentifier(), bytes("<entry/>"));
        ASSERT_TRUE(std::filesystem::exists(entryFile(entry)));
    }
};

}  // namespace

TEST_F(EntryMergeTest, TakesOverWhatADocumentSays) {
    const Ref<EntryCore> entry = storedEntry("abc");
    EXPECT_TRUE(entry->updateFrom(full(), false));
    EXPECT_EQ(textOf(entry->mTitle), "Title");
    EXPECT_EQ(textOf(entry->mRights), "Rights");
    EXPECT_EQ(textOf(entry->mAlternateURL), "http://e.org/p");
    EXPECT_EQ(time(entry->mDateCreated), 10);
    EXPECT_EQ(time(entry->mDatePublished), 20);
    EXPECT_EQ(time(entry->mDateUpdated), 30);
    EXPECT_EQ(textOf(entry->getContent()->getData()), "<p>content</p>");
    EXPECT_EQ(textOf(entry->mContentHash), sha1("<p>content</p>"));
    EXPECT_EQ(textOf(entry->getSummary()->getData()), "summary");
    EXPECT_EQ(textOf(entry->mSummaryHash), sha1("summary"));
    EXPECT_EQ(textOf(entry->getXMLRepresentation()->getData()), "<entry/>");
    EXPECT_EQ(textOf(entry->mXMLRepresentationHash), sha1("<entry/>"));
    EXPECT_EQ(textOf(entry->getAuthor()->mName), "Ann");
    EXPECT_EQ(entry->getEnclosures(nullptr)->mLength, 1024);
    EXPECT_TRUE(hasNewData(*entry) && hasNewSource(*entry));
}

TEST_F(EntryMergeTest, EqualValuesLeaveItUnchanged) {
    const Ref<EntryCore> entry = storedFull();
    EXPECT_FALSE(entry->updateFrom(full(), true));
    EXPECT_FALSE(entry->isChanged());
    EXPECT_FALSE(entry->updateFrom(full(), false));
    EXPECT_FALSE(entry->isChanged());
    EXPECT_FALSE(hasNewData(*entry) || hasNewSource(*entry));
    // Nor is anything seen as changed that was not read yet.
    entry->unload();
    EXPECT_FALSE(entry->updateFrom(full(), true));
    EXPECT_FALSE(TableOf<ContentCore>::instance()->isChanged());
    EXPECT_FALSE(TableOf<EnclosureCore>::instance()->isChanged());
}

TEST_F(EntryMergeTest, WithForceANullTitleClearsIt) {
    const Ref<EntryCore> entry = storedFull();
    const Ref<EntryCore> newEntry = full();
    newEntry->mTitle.setValue(nullptr);
    EXPECT_FALSE(entry->updateFrom(newEntry, false));
    EXPECT_EQ(textOf(entry->mTitle), "Title");
    EXPECT_TRUE(entry->updateFrom(newEntry, true));
    EXPECT_EQ(textOf(entry->mTitle), "(null)");
}

TEST_F(EntryMergeTest, WithoutForceAnEmptyTitleLeavesItAlone) {
    const Ref<EntryCore> entry = storedFull();
    const Ref<EntryCore> newEntry = full();
    newEntry->mTitle.setValue(str(""));
    EXPECT_FALSE(entry->updateFrom(newEntry, false));
    EXPECT_EQ(textOf(entry->mTitle), "Title");
    EXPECT_TRUE(entry->updateFrom(newEntry, true));
    EXPECT_EQ(textOf(entry->mTitle), "");
}

TEST_F(EntryMergeTest, WithForceAllThatIsMissingGoes) {
    const Ref<EntryCore> entry = storedFull();
    EXPECT_TRUE(entry->updateFrom(parsed(), false));  // the author and the enclosure go
    EXPECT_EQ(textOf(entry->mID), "abc");
    EXPECT_EQ(time(entry->mDatePublished), 20);
    EXPECT_NE(entry->getContent(), nullptr);
    EXPECT_NE(entry->getSummary(), nullptr);
    EXPECT_NE(entry->getXMLRepresentation(), nullptr);
    EXPECT_TRUE(entry->updateFrom(parsed(), true));
    EXPECT_EQ(textOf(entry->mID), "(null)");
    EXPECT_EQ(textOf(entry->mRights), "(null)");
    EXPECT_EQ(entry->mAlternateURL.getValue(), nullptr);
    EXPECT_EQ(entry->mDateCreated.getValue(), nullptr);
    EXPECT_EQ(entry->mDatePublished.getValue(), nullptr);
    EXPECT_EQ(entry->mDateUpdated.getValue(), nullptr);
    EXPECT_EQ(entry->getContent(), nullptr);
    EXPECT_EQ(entry->getSummary(), nullptr);
    EXPECT_EQ(entry->getXMLRepresentation(), nullptr);
    EXPECT_EQ(textOf(entry->mContentHash), "(null)");
    EXPECT_EQ(textOf(entry->mSummaryHash), "(null)");
    EXPECT_EQ(textOf(entry->mXMLRepresentationHash), "(null)");
    db().saveRows();
    EXPECT_EQ(count("Contents"), 0);
}

TEST_F(EntryMergeTest, ANewSourceAloneIsNoChangeOfTheData) {
    const Ref<EntryCore> entry = storedFull();
    const Ref<EntryCore> newEntry = full();
    newEntry->mXMLRepresentationHash.setValue(nullptr);
    newEntry->setContentColumn("XMLRepresentation", nullptr, bytes("<entry></entry>"));
    EXPECT_TRUE(entry->updateFrom(newEntry, true));
    EXPECT_FALSE(hasNewData(*entry));
    EXPECT_TRUE(hasNewSource(*entry));
    EXPECT_EQ(textOf(entry->mXMLRepresentationHash), sha1("<entry></entry>"));
}

TEST_F(EntryMergeTest, AChangeOfAContentIsOneOfTheData) {
    const Ref<EntryCore> entry = storedFull();
    const Ref<EntryCore> newEntry = full();
    newEntry->setContentColumn("summary", str("text/plain"), bytes("more"));
    EXPECT_TRUE(entry->updateFrom(newEntry, false));
    EXPECT_TRUE(hasNewData(*entry) && hasNewSource(*entry));
    EXPECT_EQ(textOf(entry->mSummaryHash), sha1("more"));
}

TEST_F(EntryMergeTest, ANewEntryKeepsWhenItWasFirstSeen) {
    const LogCapture log;
    const LoggingOn on({&gLogSub});
    const Ref<EntryCore> entry = newEntry();
    const Ref<EntryCore> newEntry = full();
    newEntry->mLocalDateCreated.setValue(date(1234.5));
    EXPECT_TRUE(entry->updateFrom(newEntry, true));
    EXPECT_EQ(time(entry->mLocalDateCreated), 1234.5);
    EXPECT_TRUE(log.contains("[Sub]     Adding new entry 'Title' (created 1234.500)"));
    EXPECT_FALSE(log.contains("Comparing entry"));
    EXPECT_FALSE(log.contains("Updated entry"));
}

TEST_F(EntryMergeTest, AStoredEntryKeepsWhenItWasFirstSeen) {
    const Ref<EntryCore> entry = storedFull();
    const LogCapture log;
    const LoggingOn on({&gLogSub});
    const Ref<EntryCore> newEntry = full();
    newEntry->mLocalDateCreated.setValue(date(1234.5));
    newEntry->mTitle.setValue(str("New"));
    EXPECT_TRUE(entry->updateFrom(newEntry, true));
    EXPECT_EQ(time(entry->mLocalDateCreated), 1000);
    EXPECT_TRUE(
        log.contains("[Sub]     Comparing entry  " + textOf(entry->toString()) + " 'Title'"));
    EXPECT_TRUE(log.contains("[Sub]     Updated entry 'New'"));
    EXPECT_FALSE(log.contains("Adding new entry"));
}

TEST_F(EntryMergeTest, ANewEntryIsIdentifiedByWhatItTakesOver) {
    const Ref<EntryCore> entry = newEntry();
    EXPECT_TRUE(entry->updateFrom(full(), true));
    EXPECT_TRUE(entry->mCurrent);
    EXPECT_EQ(textOf(entry->getIdentifier()), sha1(feedHash + "abc"));
}

TEST_F(EntryMergeTest, NeedsAnEntryToMerge) {
    const LogCapture log;
    const Ref<EntryCore> entry = storedEntry("abc");
    EXPECT_THROW(entry->updateFrom(nullptr, true), AssertionFailure);
}

TEST_F(EntryMergeTest, LeavesTheArchiveWhenItIsBack) {
    const Ref<EntryCore> entry = storedFull();
    entry->mCurrent.setValue(false);
    entry->saveChanges();
    archive(*entry);
    EXPECT_TRUE(entry->updateFrom(full(), true));
    EXPECT_TRUE(entry->mCurrent);
    EXPECT_FALSE(std::filesystem::exists(entryFile(*entry)));
}

TEST_F(EntryMergeTest, KeepsItsFileWhereItDoesNotComeBack) {
    const Ref<EntryCore> entry = storedFull();
    archive(*entry);
    EXPECT_FALSE(entry->updateFrom(full(), true));
    EXPECT_TRUE(std::filesystem::exists(entryFile(*entry)));
    const Ref<EntryCore> recovered = full();
    recovered->mCurrent.setValue(false);
    EXPECT_TRUE(entry->updateFrom(recovered, true));
    EXPECT_FALSE(entry->mCurrent);
    EXPECT_TRUE(std::filesystem::exists(entryFile(*entry)));
}

TEST_F(EntryMergeTest, SharesOneRowForEachAuthor) {
    const LogCapture log;
    const LoggingOn on({&gLogSub});
    const Ref<EntryCore> first = storedEntry("1");
    const Ref<EntryCore> second = storedEntry("2");
    const Ref<EntryCore> newFirst = full();
    first->updateAuthorsFrom(newFirst.get());
    EXPECT_EQ(count("Authors"), 1);
    const std::string ann = textOf(newFirst->getAuthor()->toString());
    EXPECT_TRUE(log.contains("[Sub]     Adding author Orvane::AuthorCore["));
    EXPECT_TRUE(log.contains("[Sub]     Author = " + ann));
    log.lines();
    const Ref<EntryCore> newSecond = full();
    second->updateAuthorsFrom(newSecond.get());
    EXPECT_EQ(second->getAuthor(), first->getAuthor());
    EXPECT_EQ(log.count("Adding author"), 1);
    EXPECT_EQ(log.count("Author = "), 2);
    db().saveRows();
    EXPECT_EQ(count("Authors"), 1);
    EXPECT_EQ(count("Entries where author=1"), 2);
}

TEST_F(EntryMergeTest, AnEqualAuthorChangesNothing) {
    const Ref<EntryCore> entry = storedFull();
    const AuthorCore* ann = entry->getAuthor();
    const LogCapture log;
    const LoggingOn on({&gLogSub});
    const Ref<EntryCore> newEntry = full();
    entry->updateAuthorsFrom(newEntry.get());
    EXPECT_EQ(entry->getAuthor(), ann);
    EXPECT_FALSE(entry->isChanged());
    EXPECT_FALSE(log.contains("uthor"));
}

TEST_F(EntryMergeTest, LosesAnAuthorThatIsNobody) {
    const Ref<EntryCore> entry = storedFull();
    const Ref<EntryCore> newEntry = parsed();
    newEntry->setAuthor(make<AuthorCore>());
    entry->updateAuthorsFrom(newEntry.get());
    EXPECT_EQ(entry->getAuthor(), nullptr);
    EXPECT_TRUE(entry->isChanged());
    db().saveRows();
    entry->updateAuthorsFrom(parsed().get());
    EXPECT_FALSE(entry->isChanged());
}

TEST_F(EntryMergeTest, AnEntryInMemoryKeepsAnAuthorThatCannotBeStored) {
    reopen(false);
    const Ref<EntryCore> entry = make<EntryCore>();
    const Ref<EntryCore> newEntry = full();
    EXPECT_TRUE(entry->updateFrom(newEntry, true));
    EXPECT_EQ(entry->getAuthor(), newEntry->getAuthor());
    EXPECT_EQ(entry->getAuthor()->getRowID(), 0);
}

TEST_F(EntryMergeTest, AnEnclosureOfTheSameURLKeepsItsDownload) {
    const Ref<EntryCore> entry = storedFull();
    const Ref<EnclosureCore> kept = entry->getEnclosures(nullptr).getRow();
    kept->mDownloadState.setValue(EnclosureCore::kFinished);
    kept->mDownloadedPath.setValue(url("file:///tmp/a.mp3"));
    db().saveRows();
    const LogCapture log;
    const LoggingOn on({&gLogSub});
    const Ref<EntryCore> newEntry = parsed();
    EnclosureCore* changed = enclosure("http://e.org/a.mp3", "audio/ogg", 2048);
    changed->mTitle.setValue(str("Song"));
    newEntry->addToEnclosures(changed);
    entry->updateEnclosuresFrom(newEntry.get());
    EXPECT_TRUE(entry->isChanged());
    EXPECT_TRUE(log.contains(
        "[Sub]     Updated Orvane::EnclosureCore[<http://e.org/a.mp3> audio/ogg 2KB]"));
    db().saveRows();
    EXPECT_EQ(count("Enclosures where rowID=1 and length=2048 and mimeType='audio/ogg' and "
                    "title='Song' and downloadState=3 and downloadedPath='file:///tmp/a.mp3'"),
              1);
    EXPECT_EQ(count("Enclosures"), 1);
}

TEST_F(EntryMergeTest, AddsAndDeletesEnclosures) {
    const Ref<EntryCore> entry = storedFull();
    const LogCapture log;
    const LoggingOn on({&gLogSub});
    const Ref<EntryCore> newEntry = parsed();
    newEntry->addToEnclosures(enclosure("http://e.org/b.mp3", "audio/mpeg", 3072));
    newEntry->addToEnclosures(make<EnclosureCore>());  // without a URL
    entry->updateEnclosuresFrom(newEntry.get());
    EXPECT_TRUE(entry->isChanged());
    EXPECT_TRUE(log.contains(
        "[Sub]     Deleted Orvane::EnclosureCore[<http://e.org/a.mp3> audio/mpeg 1KB]"));
    EXPECT_TRUE(
        log.contains("[Sub]     Added Orvane::EnclosureCore[<http://e.org/b.mp3> audio/mpeg 3KB]"));
    entry->saveChanges();
    EXPECT_EQ(count("Enclosures where entry=1 and url='http://e.org/b.mp3' and length=3072"), 1);
    EXPECT_EQ(count("Enclosures where downloadAuditStatus=2"), 1);
    EXPECT_EQ(count("Enclosures"), 1);
}

TEST_F(EntryMergeTest, DeletesAnEnclosureThatIsNotStoredYet) {
    const Ref<EntryCore> entry = newEntry("abc");
    const Ref<EnclosureCore> gone = enclosure("http://e.org/gone");
    entry->addToEnclosures(gone.get());
    entry->updateEnclosuresFrom(parsed().get());
    EXPECT_FALSE(entry->getEnclosures(nullptr).hasRow());
    EXPECT_EQ(gone->getEntry(), nullptr);
    entry->saveChanges();
    EXPECT_EQ(count("Enclosures"), 0);
}

TEST_F(EntryMergeTest, OfTwoEnclosuresOfOneURLEachHasItsOwnMatch) {
    const Ref<EntryCore> entry = storedEntry("abc");
    const Ref<EntryCore> newEntry = parsed();
    newEntry->addToEnclosures(enclosure("http://e.org/a", nullptr, 1));
    newEntry->addToEnclosures(enclosure("http://e.org/a", nullptr, 2));
    entry->updateEnclosuresFrom(newEntry.get());
    entry->saveChanges();
    EXPECT_EQ(count("Enclosures"), 2);
    entry->updateEnclosuresFrom(newEntry.get());
    EXPECT_FALSE(entry->isChanged());
}

TEST_F(EntryMergeTest, AnApprovedEnclosureWaitsForItsDownload) {
    const Ref<SubscriptionCore> subscription = subscribe("com.example.reader");
    subscription->mDownloadsEnclosures.setValue(true);
    const Ref<EntryCore> entry = storedFull();
    EXPECT_EQ(count("Enclosures where downloadAuditStatus=1"), 1);
}

TEST_F(EntryMergeTest, TidiesWhatItStores) {
    const Ref<EntryCore> entry = storedEntry("abc");
    const Ref<EntryCore> newEntry = parsed();
    const Ref<ContentCore> content = make<ContentCore>();
    content->mMIMEType.setValue(str("text/html"));
    content->mData.setValue(bytes("<p>"));
    content->tidy(nullptr);
    newEntry->setContent(content.get());
    // A better one, which does not make the first one be read.
    content->mData.setValue(bytes("<p>a"));
    newEntry->setContent(content.get());
    EXPECT_TRUE(newEntry->getContent()->needsTidy());
    entry->updateFrom(newEntry, true);
    EXPECT_FALSE(entry->getContent()->needsTidy());
    EXPECT_EQ(textOf(entry->getContent()->getData()), "<p>a</p>");
    EXPECT_EQ(textOf(entry->mContentHash), sha1("<p>a</p>"));
}
