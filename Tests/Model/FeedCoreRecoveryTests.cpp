#include "Foundation/Logger.h"
#include "Foundation/NetException.h"
#include "Foundation/Number.h"
#include "Model/FeedCore.h"
#include "Model/FeedTest.h"
#include "Model/FileReader.h"
#include "Model/ParseMark.h"
#include "SQLite/Exception.h"
#include "Utilities/FileUtils.h"

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;
using Support::LoggingOn;

namespace {

class FeedCoreRecovery : public FeedTest {
 protected:
    FeedCoreRecovery() { feed->mRecoverOldEntries.setValue(true); }

    /// What identifies the feed's entry of an ID.
    static std::string identifierOf(const std::string& id) {
        return text(data(kIdentifier + id)->SHA1HashString());
    }
    /// Saves an entry to a file, as the document of that ID and title.
    URL* archive(const std::string& id, const char* title = "Post") const {
        return write(identifierOf(id), "entry " + id + " " + title);
    }
    URL* write(const std::string& name, const std::string& content) const {
        feed->saveEntryToFile(string(name), data(content));
        return feed->getURLOfEntryXMLFile(string(name));
    }
    std::string titles() const {
        std::string result;
        for (auto entry = feed->getEntries(nullptr); entry.hasRow(); entry.nextRow()) {
            result += text(entry->mTitle) + " ";
        }
        return result;
    }
    static EntryCore* entry(const std::string& id) {
        return EntryCore::getEntryWithIdentifier(string(identifierOf(id)));
    }

    FakeParser parser;
    FeedCore* const feed = storedFeed();
};

/// Says when files are opened and waited for.
std::string sReads;

class LoggingReader : public FileReader {
 public:
    explicit LoggingReader(URL* url) : mURL(url), mName(url->getLastPathComponent()) {
        sReads += "open ";
    }
    DataReturner finish() override {
        sReads += "finish ";
        return Data::dataFromResource(mURL);
    }

 private:
    Ref<URL> mURL;
    Ref<String> mName;
};

}  // namespace

TEST_F(FeedCoreRecovery, ReadsTheEntryFilesWhenEntriesAreFirstAskedFor) {
    archive("a", "One");
    archive("b", "Two");
    EXPECT_EQ(parser.calls, "");
    const std::string first = titles();
    EXPECT_TRUE(first == "One Two " || first == "Two One ") << first;
    EXPECT_FALSE(feed->mRecoverOldEntries);
    EXPECT_EQ(parser.lastURL, kAddress);
    parser.calls.clear();
    EXPECT_EQ(titles(), first);
    EXPECT_EQ(parser.calls, "");
    EXPECT_EQ(count("Entries where current=0 and read=1 and feed=1"), 2);
    EXPECT_EQ(count("Feeds where recoverOldEntries=0"), 1);
}

TEST_F(FeedCoreRecovery, GivesEntriesTheDatesOfTheirFiles) {
    URL* file = archive("a");
    const Ref<Date> created = FileUtils::getFileCreationDate(file);
    titles();
    if (!created.get()) GTEST_SKIP() << "no dates of creation here";
    EXPECT_TRUE(IsEqual(entry("a")->mLocalDateCreated.getValue(), created.get()));
    EXPECT_TRUE(IsEqual(entry("a")->mLocalDateUpdated.getValue(), created.get()));
}

TEST_F(FeedCoreRecovery, LogsWhatItReads) {
    const LoggingOn on({&gLogSub, &gLogTruth});
    archive("a", "One");
    log.clear();
    titles();
    EXPECT_EQ(log.count("[Truth] Reading 1 entry files for " + text(feed->toString()) +
                        " from file://" + truth(kIdentifier) + "/"),
              1);
    EXPECT_EQ(log.count("[Truth] ...reading entry files took 0 sec"), 1);
    EXPECT_EQ(log.count("[Sub]     Recovered archived entry 'One' from <file://" +
                        truth(kIdentifier) + "/" + identifierOf("a") + ".xml>"),
              1);
}

TEST_F(FeedCoreRecovery, LooksAtXMLFilesAlone) {
    archive("a");
    directory.writeFile("Orvane/Feeds/" + std::string(kIdentifier) + "/note.txt", "entry b Two");
    directory.makeDirectory("Orvane/Feeds/" + std::string(kIdentifier) + "/folder.xml");
    EXPECT_EQ(titles(), "Post ");
    EXPECT_EQ(log.count("Unable to recover"), 0);
}

TEST_F(FeedCoreRecovery, HasNothingToReadWithoutADirectory) {
    EXPECT_EQ(titles(), "");
    EXPECT_FALSE(feed->mRecoverOldEntries);
}

TEST_F(FeedCoreRecovery, ReadsOneFileWhileItParsesTheOneBefore) {
    archive("a");
    archive("b");
    sReads.clear();
    FileReader::setMaker([](URL* url) -> std::unique_ptr<FileReader> {
        return std::make_unique<LoggingReader>(url);
    });
    class Noting : public FakeParser {
        Returner<EntryCore> parseEntry(Data* data, URL* url) override {
            sReads += "parse ";
            return FakeParser::parseEntry(data, url);
        }
    } noting;
    titles();
    FileReader::setMaker(nullptr);
    DocumentParser::setCurrent(&parser);
    EXPECT_EQ(sReads, "open finish open parse finish parse ");
}

TEST_F(FeedCoreRecovery, GoesOnBehindAFileThatItCannotRead) {
    archive("a");
    write("0bad", "no entry");
    write("zbad", "throw");
    EXPECT_EQ(titles(), "Post ");
    EXPECT_EQ(log.count("Unable to recover archived entry from <file://"), 2);
    EXPECT_EQ(log.count("bool Orvane::FeedCore::addEntryFromFile(URL *, Data *)"), 1);
}

TEST_F(FeedCoreRecovery, TakesNothingFromNoFile) {
    EXPECT_FALSE(feed->addEntryFromFile(nullptr, data("entry a One")));
    EXPECT_EQ(log.count("Unable to recover"), 0);
    EXPECT_FALSE(feed->addEntryFromFile(url("file:///x.xml"), nullptr));
    EXPECT_EQ(log.count("Unable to recover archived entry from <file:///x.xml>"), 1);
}

TEST_F(FeedCoreRecovery, UpdatesAnEntryThatIsThere) {
    EntryCore* known = row<EntryCore>();
    known->mID.setValue(string("a"));
    known->mTitle.setValue(string("Old"));
    known->mFlagged.setValue(true);
    feed->addToEntries(known);
    known->getIdentifier();
    known->saveChanges();
    URL* file = archive("a", "New");
    EXPECT_TRUE(feed->addEntryFromFile(file, data("entry a New")));
    EXPECT_EQ(text(known->mTitle), "New");
    EXPECT_TRUE(known->mFlagged);
    EXPECT_TRUE(known->mRead);
    EXPECT_FALSE(known->mCurrent);
    EXPECT_EQ(count("Entries"), 1);
}

TEST_F(FeedCoreRecovery, AdoptsAnEntryWithoutAFeed) {
    EntryCore* ghost = EntryCore::createGhostEntry(string(identifierOf("a")));
    ghost->mFlagged.setValue(true);
    ghost->saveChanges();
    EXPECT_TRUE(feed->addEntryFromFile(archive("a", "One"), data("entry a One")));
    EXPECT_EQ(ghost->getFeed(), feed);
    EXPECT_TRUE(ghost->mFlagged);
    EXPECT_EQ(titles(), "One ");
    EXPECT_EQ(count("Entries where feed=1"), 1);
}

TEST_F(FeedCoreRecovery, LeavesAnEntryAloneThatAFileHasUnderAnotherName) {
    EXPECT_TRUE(feed->addEntryFromFile(archive("a", "One"), data("entry a One")));
    EXPECT_FALSE(feed->addEntryFromFile(write("other", "x"), data("entry a Two")));
    EXPECT_EQ(text(entry("a")->mTitle), "One");
    feed->mRecoverOldEntries.setValue(false);
    EXPECT_EQ(titles(), "One ");
    db().saveRows();
    EXPECT_EQ(count("Entries"), 1);
}

TEST_F(FeedCoreRecovery, KeepsAnEntryWhoseFileHasAnotherName) {
    EXPECT_TRUE(feed->addEntryFromFile(write("other", "x"), data("entry a One")));
    EXPECT_EQ(text(entry("a")->mTitle), "One");
}

TEST_F(FeedCoreRecovery, GivesUpAnEntryThatCannotBeSaved) {
    db().execute(
        "create trigger Refuse before insert on Entries when NEW.title='bad' begin "
        "select raise(abort, 'refused'); end");
    archive("a", "bad");
    archive("b", "good");
    EXPECT_EQ(titles(), "good ");
    EXPECT_EQ(log.count("Unable to recover"), 1);
    db().execute("drop trigger Refuse");
    db().saveRows();
    EXPECT_EQ(count("Entries"), 1);
}

TEST_F(FeedCoreRecovery, LeavesAStoredEntryAsItWasIfItCannotBeSaved) {
    EntryCore* known = row<EntryCore>();
    known->mID.setValue(string("a"));
    known->mTitle.setValue(string("Old"));
    feed->addToEntries(known);
    known->getIdentifier();
    known->saveChanges();
    db().execute(
        "create trigger Refuse before update on Entries begin select raise(abort, 'refused'); end");
    EXPECT_FALSE(feed->addEntryFromFile(archive("a", "New"), data("entry a New")));
    db().execute("drop trigger Refuse");
    db().saveRows();
    EXPECT_EQ(text(known->mTitle), "Old");
    EXPECT_FALSE(known->mRead);
}

TEST_F(FeedCoreRecovery, WaitsForAParser) {
    DocumentParser::setCurrent(nullptr);
    archive("a");
    EXPECT_EQ(titles(), "");
    EXPECT_TRUE(feed->mRecoverOldEntries);
    DocumentParser::setCurrent(&parser);
    EXPECT_EQ(titles(), "Post ");
}

TEST_F(FeedCoreRecovery, AsksTheAgentWhereItCannotBeDone) {
    archive("a");
    feed->saveChanges();
    reopen(false);
    FakeAgent agent;
    FeedCore* read = FeedCore::getRow(1);
    EXPECT_FALSE(read->getEntries(nullptr).hasRow());
    EXPECT_EQ(agent.calls, "recoverOldEntries(1) ");
    EXPECT_FALSE(read->mRecoverOldEntries.isLoaded());
    EXPECT_EQ(parser.calls, "");
}

TEST_F(FeedCoreRecovery, GivesWhatThereIsWhereTheAgentCannotBeAsked) {
    EntryCore* known = row<EntryCore>();
    known->mID.setValue(string("a"));
    feed->addToEntries(known);
    feed->saveChanges();
    reopen(false);
    EXPECT_TRUE(FeedCore::getRow(1)->getEntries(nullptr).hasRow());
    EXPECT_EQ(log.count("void Orvane::FeedCore::recoverOldEntries()"), 1);
}

TEST_F(FeedCoreRecovery, MergesTheSavedDocument) {
    FakeFeeders feeders;
    feed->mRecoverOldEntries.setValue(false);
    feed->setXMLData(data("<rss/>"));
    const Ref<Date> saved = FileUtils::getFileModDate(feed->getURLOfXMLFile());
    feed->recoverFromXMLData();
    EXPECT_EQ(feeders.feeder->calls, "parse ");
    EXPECT_EQ(feeders.feeder->parsed.front(), "<rss/>");
    EXPECT_TRUE(IsEqual(feed->mRefreshLocalDate.getValue(), saved.get()));
    EXPECT_TRUE(feed->mRecoverOldEntries);
    EXPECT_FALSE(db().isInTransaction());
}

TEST_F(FeedCoreRecovery, HasNothingToMergeWithoutADocument) {
    FakeFeeders feeders;
    feed->mRecoverOldEntries.setValue(false);
    feed->recoverFromXMLData();
    EXPECT_EQ(feeders.made, 0);
    EXPECT_EQ(feed->mRefreshLocalDate.getValue(), nullptr);
    EXPECT_TRUE(feed->mRecoverOldEntries);
}

TEST_F(FeedCoreRecovery, DoesNotParseADocumentThatHasBroughtTheProcessDownTwice) {
    FakeFeeders feeders;
    feed->setXMLData(data("<rss/>"));
    const Ref<URL> file = feed->getURLOfXMLFile();
    leaveMarks(file.get(), 1);
    feed->recoverFromXMLData();
    EXPECT_EQ(feeders.feeder->calls, "parse ");
    EXPECT_EQ(feed->getLastError(), NetError::None);
    leaveMarks(file.get(), 2);
    feed->recoverFromXMLData();
    EXPECT_EQ(feeders.feeder->calls, "parse ");
    EXPECT_EQ(feed->getLastError(), NetError(NetError::kOrvane, OVInternalError));
    EXPECT_EQ(log.count("Not parsing <file://"), 1);
    clock.advanceBy(ParseMark::kBlockedSeconds);
    feed->recoverFromXMLData();
    EXPECT_EQ(feeders.feeder->calls, "parse parse ");
}

TEST_F(FeedCoreRecovery, DoesNotParseAnEntryThatHasBroughtTheProcessDownTwice) {
    leaveMarks(archive("a"), 2);
    archive("b", "Two");
    EXPECT_EQ(titles(), "Two ");
    EXPECT_EQ(log.count("Unable to recover archived entry from <file://"), 1);
}
