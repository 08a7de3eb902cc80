#include "Model/EnclosureTest.h"

#include <filesystem>

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

class EnclosureSelectionTest : public EnclosureTest {
 protected:
    EnclosureSelectionTest() { EnclosureCore::_forgetAutoDownloads(); }

    Ref<EnclosureCore> approved(const char* location) {
        Ref<EnclosureCore> row = stored(location);
        row->mDownloadAuditStatus.setValue(EnclosureCore::kApproved);
        db().saveRows();
        return row;
    }
    /// The IDs of those that a call starts.
    std::string start() {
        port.calls.clear();
        const bool isStarted = EnclosureCore::startAutoDownloads();
        EXPECT_EQ(isStarted, !port.calls.empty());
        return port.calls;
    }

    FakeDownloaders port;
};

}  // namespace

TEST_F(EnclosureSelectionTest, StartsAtMostTwoInACallAndEachOnce) {
    const Ref<EnclosureCore> a = approved("http://e.org/a");
    const Ref<EnclosureCore> b = approved("http://e.org/b");
    const Ref<EnclosureCore> c = approved("http://e.org/c");
    const LogCapture log;
    const LoggingOn on({&gLogDownload});
    EXPECT_EQ(start(), "make(1) start make(2) start ");
    EXPECT_TRUE(log.contains("[Download] Starting auto-download of " + textOf(a->toString())));
    EXPECT_EQ(start(), "make(3) start ");
    EXPECT_FALSE(log.contains("Found no"));
    EXPECT_EQ(start(), "");
    EXPECT_TRUE(log.contains("[Download] Found no enclosures to auto-download"));
}

TEST_F(EnclosureSelectionTest, GetsPastOneThatCannotBeStarted) {
    const Ref<EnclosureCore> broken = approved("http://e.org/a");
    const Ref<EnclosureCore> next = approved("http://e.org/b");
    port.isBroken = true;
    EXPECT_THROW(EnclosureCore::startAutoDownloads(), std::runtime_error);
    port.isBroken = false;
    EXPECT_EQ(start(), "make(2) start ");
}

TEST_F(EnclosureSelectionTest, StartsNothingWhereNothingCanBeDownloaded) {
    const Ref<EnclosureCore> row = approved("http://e.org/a");
    DownloaderFactory* const before = DownloaderFactory::current();
    DownloaderFactory::setCurrent(nullptr);
    const LogCapture log;
    const LoggingOn on({&gLogDownload});
    EXPECT_FALSE(EnclosureCore::startAutoDownloads());
    DownloaderFactory::setCurrent(before);
    EXPECT_TRUE(log.contains("[Download] Found no enclosures to auto-download"));
}

TEST_F(EnclosureSelectionTest, StartsOnlyWhatIsApproved) {
    const Ref<EnclosureCore> row = stored("http://e.org/a");
    EXPECT_EQ(start(), "");
    row->mDownloadAuditStatus.setValue(EnclosureCore::kNotApproved);
    db().saveRows();
    EXPECT_EQ(start(), "");
}

TEST_F(EnclosureSelectionTest, StartsNothingThatIsFinishedOrDeleted) {
    const Ref<EnclosureCore> row = approved("http://e.org/a");
    for (const int state : {3, 5}) {
        row->mDownloadState.setValue(state);
        db().saveRows();
        EXPECT_EQ(start(), "") << "state " << state;
    }
    for (const int state : {0, 1, 2, 4}) {
        row->mDownloadState.setValue(state);
        db().saveRows();
        EnclosureCore::_forgetAutoDownloads();
        EXPECT_NE(start(), "") << "state " << state;
    }
}

TEST_F(EnclosureSelectionTest, SkipsWhatTheUserCancelledAndRetriesOtherFailuresOnce) {
    const Ref<EnclosureCore> cancelled = approved("http://e.org/a");
    cancelled->mDownloadState.setValue(EnclosureCore::kFailed);
    cancelled->setDownloadError({15, -999});
    const Ref<EnclosureCore> failed = approved("http://e.org/b");
    failed->mDownloadState.setValue(EnclosureCore::kFailed);
    failed->setDownloadError({15, -1001});
    const Ref<EnclosureCore> other = approved("http://e.org/c");
    other->mDownloadState.setValue(EnclosureCore::kFailed);
    other->setDownloadError({NetError::kHTTP, -999});
    db().saveRows();
    EXPECT_EQ(start(), "make(2) start make(3) start ");
    EXPECT_EQ(start(), "");
}

TEST_F(EnclosureSelectionTest, StartsNothingWithoutADatabase) {
    const Ref<EnclosureCore> row = approved("http://e.org/a");
    db().close(true);
    EXPECT_EQ(start(), "");
}

TEST_F(EnclosureSelectionTest, IsApprovedIfASubscriptionWantsIt) {
    const Ref<SubscriptionCore> first = subscribe("com.example.one");
    const Ref<SubscriptionCore> second = subscribe("com.example.two");
    const Ref<EnclosureCore> row = stored("http://e.org/a");
    const LogCapture log;
    const LoggingOn on({&gLogSub});
    row->auditForDownload();
    EXPECT_EQ(row->mDownloadAuditStatus, 2);
    EXPECT_FALSE(log.contains("Approved"));
    second->mDownloadsEnclosures.setValue(true);
    row->auditForDownload();
    EXPECT_EQ(row->mDownloadAuditStatus, 1);
    EXPECT_TRUE(log.contains("[Sub] Approved " + textOf(row->toString()) + " for auto-download"));
}

TEST_F(EnclosureSelectionTest, IsNotApprovedWithoutAFeed) {
    const Ref<EnclosureCore> row = enclosure("http://e.org/a");
    row->auditForDownload();
    EXPECT_EQ(row->mDownloadAuditStatus, 2);
    const Ref<EntryCore> ghost = EntryCore::createGhostEntry(str("0123"));
    ghost->addToEnclosures(row.get());
    row->auditForDownload();
    EXPECT_EQ(row->mDownloadAuditStatus, 2);
}

TEST_F(EnclosureSelectionTest, ListsAClientsEnclosures) {
    const Ref<SubscriptionCore> mine = subscribe("com.example.one");
    const Ref<SubscriptionCore> again = make<SubscriptionCore>();
    again->mClient.setValue(mine->getClient());
    again->setFeed(feed.get());
    const Ref<SubscriptionCore> others = subscribe("com.example.two");
    const Ref<EnclosureCore> done = stored("http://e.org/a");
    done->mDownloadState.setValue(EnclosureCore::kFinished);
    const Ref<EnclosureCore> waiting = stored("http://e.org/b");
    const Ref<EntryCore> ghost = EntryCore::createGhostEntry(str("0123"));
    ghost->addToEnclosures(enclosure("http://e.org/c"));
    ghost->saveChanges();
    db().saveRows();
    auto found = EnclosureCore::getEnclosures(mine->getClient(), nullptr);
    EXPECT_EQ(found.getRow(), waiting.get());
    ASSERT_TRUE(found.nextRow());
    EXPECT_EQ(found.getRow(), done.get());
    EXPECT_FALSE(found.nextRow());
    auto some = EnclosureCore::getEnclosures(mine->getClient(), "encl.downloadState=3");
    EXPECT_EQ(some.getRow(), done.get());
    EXPECT_FALSE(some.nextRow());
}

TEST_F(EnclosureSelectionTest, DeletesEnclosuresWithTheirFiles) {
    const Ref<EnclosureCore> a = stored("http://e.org/a");
    const Ref<EnclosureCore> b = stored("http://e.org/b");
    const Ref<EnclosureCore> kept = stored("http://e.org/c");
    const std::string file = directory.writeFile("a", "1");
    const std::string keptFile = directory.writeFile("c", "1");
    const Ref<URL> place = URL::urlWithFileSystemPath(file.c_str(), false);
    a->mDownloadedPath.setValue(place.get());
    const Ref<URL> keptPlace = URL::urlWithFileSystemPath(keptFile.c_str(), false);
    kept->mDownloadedPath.setValue(keptPlace.get());
    db().saveRows();
    const LogCapture log;
    const LoggingOn on({});
    EXPECT_EQ(EnclosureCore::deleteEnclosuresWhere("url<>'http://e.org/c'"), 2);
    EXPECT_FALSE(std::filesystem::exists(file));
    EXPECT_TRUE(std::filesystem::exists(keptFile));
    EXPECT_EQ(log.count("Deleting enclosure file://" + file), 1);
    EXPECT_EQ(log.count("Deleting enclosure"), 1);
    EXPECT_EQ(count("Enclosures"), 1);
    EXPECT_EQ(TableOf<EnclosureCore>::instance()->getCachedRowCount(), 0u);
}
