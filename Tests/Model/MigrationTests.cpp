#include "Model/Migrations.h"

#include "Foundation/TimeZone.h"
#include "Model/ClientCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/FakeHousekeeping.h"
#include "Model/FeedCore.h"
#include "Model/OldSchema.h"
#include "Model/StorageTest.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/Exception.h"
#include "SQLite/TableOf.h"
#include "Support/FaultVFS.h"

#include <gmock/gmock.h>

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;
using testing::ElementsAre;
using testing::UnorderedElementsAre;
using Strings = std::vector<std::string>;

namespace {

constexpr int kFull = 13;  // SQLITE_FULL

/// A database of an old version, which is open.
class MigrationTest : public StorageTest {
 protected:
    void make(int version) {
        std::filesystem::create_directories(storage());
        db().open((storage() / "Database.sqlite3").c_str(), true);
        OldSchema::make(version);
        log.clear();
    }
    static Strings columns(const char* table) {
        Strings result;
        for (Cursor cursor(&db(),
                           "select name || ' ' || lower(type) || coalesce(' ' || dflt_value, '') "
                           "from pragma_table_info('%q') order by cid",
                           table);
             cursor.hasRow(); cursor.nextRow()) {
            result.emplace_back(cursor.cStringColumn(0));
        }
        return result;
    }
    static Strings names(const char* type) {
        Strings result;
        for (Cursor cursor(&db(), "select sql from sqlite_master where type='%q' and sql not null",
                           type);
             cursor.hasRow(); cursor.nextRow()) {
            result.emplace_back(cursor.cStringColumn(0));
        }
        return result;
    }

    FakeHousekeeping housekeeping;
};

/// On a disk that can fail.
struct Disk {
    Support::FaultVFS disk;
};
class MigrationOnDiskTest : public Disk, public MigrationTest {};

/// From each version.
class MigrationFromTest : public MigrationTest, public testing::WithParamInterface<int> {
 protected:
    MigrationFromTest() {
        make(GetParam());
        Migrations::run(GetParam() % 10000);
    }
};

}  // namespace

TEST_P(MigrationFromTest, EndsWithTheColumnsOfAMigratedDatabase) {
    EXPECT_EQ(db().getUserVersion(), 10022);
    EXPECT_THAT(columns("Clients"),
                ElementsAre("rowID integer", "signature text", "private integer", "dateUsed real"));
    EXPECT_THAT(
        columns("Subscriptions"),
        ElementsAre("rowID integer", "client integer", "feed integer", "refreshInterval real",
                    "expirationInterval real", "refreshesInBackground integer",
                    "downloadsEnclosures integer", "maxEnclosureSize real",
                    "enclosureTypesString text", "expirationDate number", "unreadCount integer"));
    EXPECT_THAT(
        columns("Feeds"),
        ElementsAre("rowID integer", "identifier text", "id text", "title text", "subtitle text",
                    "rights text", "minUpdateInterval real 0.0", "dateUpdated real", "url text",
                    "alternateUrl text", "iconUrl text", "logoUrl text", "lastErrorDomain integer",
                    "lastErrorCode integer", "redirectedUrl text", "localDateUpdated real",
                    "refreshLocalDate real", "refreshHttpDate text", "refreshEtag text",
                    "refreshDataHash text", "login text", "publishingProtocol integer",
                    "rebuildXml integer", "feedFormat integer", "timeZoneUpdated integer",
                    "linkLocalGuid text", "monkey blob", "recoverOldEntries integer",
                    "foafUrl text", "localDateCreatedOfNewestEntry real"));
    EXPECT_THAT(
        columns("Entries"),
        ElementsAre("rowID integer", "identifier text", "id text", "title text", "rights text",
                    "content integer", "summary integer", "xmlRepresentation integer",
                    "dateUpdated real", "datePublished real", "dateCreated real", "baseUrl text",
                    "alternateUrl text", "author integer", "feed integer", "current integer",
                    "tombstone integer", "read integer", "flagged integer", "localDateCreated real",
                    "localDateUpdated real", "localDateFlagsUpdated real", "rebuildXml integer",
                    "timeZoneUpdated integer", "timeZonePublished integer",
                    "timeZoneCreated integer", "contentHash text", "summaryHash text",
                    "xmlRepresentationHash text", "localDateXmlChanged real"));
    EXPECT_THAT(columns("Enclosures"),
                ElementsAre("rowID integer", "entry integer", "url text", "mimeType text",
                            "length integer", "downloadedPath text", "downloadErrorDomain integer",
                            "downloadErrorCode integer", "downloadState integer",
                            "downloadAuditStatus integer", "title text"));
}

TEST_P(MigrationFromTest, EndsWithTheIndexesOfAMigratedDatabase) {
    EXPECT_EQ(rows("select name || ' ' || tbl_name || ' ' || (select group_concat(name, ', ') from "
                   "(select name from pragma_index_info(m.name) order by seqno)) "
                   "from sqlite_master as m where type='index' and sql not null order by name"),
              (Strings{"Clients_signature Clients signature",
                       "Enclosures_autodownloads Enclosures downloadState, downloadAuditStatus",
                       "Enclosures_entry Enclosures entry", "Entries_identifier Entries identifier",
                       "Entries_localDateXmlChanged Entries localDateXmlChanged",
                       "Entries_tosync Entries localDateFlagsUpdated",
                       "Entries_unreadcount Entries feed, read, localDateCreated",
                       "Feeds_identifier Feeds identifier",
                       "Feeds_localDateUpdated Feeds localDateUpdated", "Feeds_url Feeds url",
                       "Subscriptions_feedandclient Subscriptions feed, client",
                       "Subscriptions_nonbackground Subscriptions client, refreshesInBackground, "
                       "refreshInterval"}));
}

TEST_P(MigrationFromTest, EndsWithTheTriggersOfAMigratedDatabase) {
    const std::string name = "Update_Feeds_localDateCreatedOfNewestEntryInFeed_After_";
    const std::string body =
        "BEGIN UPDATE Feeds SET localDateCreatedOfNewestEntry = "
        "MAX(localDateCreatedOfNewestEntry, NEW.localDateCreated) WHERE rowID = NEW.feed; END";
    EXPECT_THAT(
        names("trigger"),
        UnorderedElementsAre(
            "CREATE TRIGGER " + name + "Update AFTER UPDATE OF localDateCreated ON Entries " + body,
            "CREATE TRIGGER " + name + "Insert AFTER INSERT ON Entries " + body));
}

TEST_P(MigrationFromTest, KeepsWhatThereIs) {
    EXPECT_EQ(rows("select rowID, signature, private from Clients"),
              Strings{"3|com.example.reader|1"});
    EXPECT_EQ(rows("select rowID, client, feed, refreshInterval from Subscriptions"),
              (Strings{"7|3|5|300.0", "8|3|6|0.0"}));
    EXPECT_EQ(rows("select rowID, url, title from Feeds"),
              (Strings{"5|http://a/|A", "6|http://b/|B"}));
    EXPECT_EQ(rows("select rowID, identifier, feed, title, content, read, localDateCreated "
                   "from Entries"),
              (Strings{"11|e1|5|First|9|1|100.0", "12|e2|5|Second|null|0|300.0",
                       "13|e3|6|Third|null|0|200.0"}));
    EXPECT_EQ(rows("select rowID, data, mimeType from Contents"), Strings{"9|abc|text/plain"});
    EXPECT_EQ(rows("select rowID, entry, url, length from Enclosures"),
              Strings{"15|11|http://a/x|1000"});
    db().integrityCheck();
}

TEST_P(MigrationFromTest, LetsItsPagesBeGivenBack) {
    EXPECT_EQ(db().execScalar("PRAGMA auto_vacuum"), 2);
    EXPECT_TRUE(db().useWriteAheadLog());
    EXPECT_EQ(db().execScalar("PRAGMA auto_vacuum"), 2);
}

TEST_P(MigrationFromTest, ServesTheRowClasses) {
    const Ref<String> name = String::string("Europe/Berlin");
    const Ref<TimeZone> zone = TimeZone::timeZone(name);
    ASSERT_TRUE(zone);
    const Ref<EntryCore> entry = TableOf<EntryCore>::instance()->rowWithID(12);
    entry->mTimeZoneUpdated.setValue(zone);
    entry->mLocalDateCreated.setValue(Date::nowPlus(-10));
    const Ref<SubscriptionCore> subscription = TableOf<SubscriptionCore>::instance()->rowWithID(7);
    subscription->mExpirationDate.setValue(Date::nowPlus(-60));
    db().saveRows();
    entry->unload();
    EXPECT_TRUE(IsEqual(entry->mTimeZoneUpdated.getValue(), zone.get()));
    const Ref<FeedCore> feed = TableOf<FeedCore>::instance()->rowWithID(5);
    feed->unload();
    EXPECT_EQ(Date::getAbsoluteTime(feed->mLocalDateCreatedOfNewestEntry), clock.now() - 10);
    EXPECT_EQ(rows("select expirationDate from Subscriptions where rowID=7"), Strings{"788918340"});
}

INSTANTIATE_TEST_SUITE_P(Versions, MigrationFromTest,
                         testing::Range(OldSchema::kOldest, OldSchema::kNewest + 1));

TEST_F(MigrationTest, GivesEveryClientTheDateOfToday) {
    make(10015);
    Migrations::run(15);
    EXPECT_EQ(rows("select dateUsed from Clients"), Strings{"788918400.0"});
    EXPECT_EQ(housekeeping.recounts, 0);
}

TEST_F(MigrationTest, AsksForTheUnreadCountsWhenTheyAreNew) {
    make(10013);
    Migrations::run(13);
    EXPECT_EQ(housekeeping.recounts, 1);
}

TEST_F(MigrationTest, FindsTheNewestEntryOfEveryFeed) {
    make(10021);
    db().execute("insert into Feeds (rowID, url) values (20, 'http://c/')");
    Migrations::run(21);
    EXPECT_EQ(rows("select rowID, localDateCreatedOfNewestEntry from Feeds"),
              (Strings{"5|300.0", "6|200.0", "20|null"}));
}

TEST_F(MigrationTest, LeavesNoHalfStep) {
    make(10005);
    db().execute("alter table Entries add column rebuildXml integer");
    EXPECT_THROW(Migrations::run(5), SQLite::Exception);
    EXPECT_FALSE(db().isInTransaction());
    EXPECT_EQ(db().getUserVersion(), 10005);
    EXPECT_THAT(columns("Feeds"), testing::Not(testing::Contains("rebuildXml integer")));
}

TEST_F(MigrationTest, KeepsTheStepsBeforeOneThatFails) {
    make(10007);
    db().execute("alter table Feeds add column foafUrl text");
    EXPECT_THROW(Migrations::run(7), SQLite::Exception);
    EXPECT_EQ(db().getUserVersion(), 10018);
    EXPECT_THAT(columns("Feeds"), testing::Contains("recoverOldEntries integer"));
    EXPECT_EQ(db().execScalar("PRAGMA auto_vacuum"), 0);
}

TEST_F(MigrationOnDiskTest, DoesWithoutIncrementalVacuumWhereTheFileCannotBeWrittenAnew) {
    make(10020);
    const unsigned hits = getExceptionHits();
    disk.failAt(Support::FaultVFS::Call::Write, 1, kFull, false);
    Migrations::run(20);
    EXPECT_TRUE(disk.hasFailed());
    EXPECT_EQ(getExceptionHits(), hits + 1);
    EXPECT_EQ(db().getUserVersion(), 10022);
    EXPECT_EQ(db().execScalar("PRAGMA auto_vacuum"), 0);
    db().integrityCheck();
}
