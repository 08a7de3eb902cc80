#include "Model/OldSchema.h"

#include "SQLite/Database.h"

namespace {

using SQLite::gDatabase;

/// As they were in version 10005.
const char* const kTables[] = {
    "create table Clients (rowID integer not null unique primary key, "
    "signature text unique not null, private integer)",
    "create table Subscriptions (rowID integer not null unique primary key, "
    "client integer references Clients(rowID) not null, feed integer references Feeds(rowID), "
    "refreshInterval real, expirationInterval real, refreshesInBackground integer, "
    "downloadsEnclosures integer, maxEnclosureSize real, enclosureTypesString text)",
    "create table Feeds (rowID integer not null unique primary key, identifier text unique, "
    "id text, title text, subtitle text, rights text, minUpdateInterval real default 0.0, "
    "dateUpdated real, url text unique not null, alternateUrl text, iconUrl text, logoUrl text, "
    "lastErrorDomain integer, lastErrorCode integer, redirectedUrl text, localDateUpdated real, "
    "refreshLocalDate real, refreshHttpDate text, refreshEtag text, refreshDataHash text, "
    "login text, publishingProtocol integer)",
    "create table Entries (rowID integer not null unique primary key, identifier text unique, "
    "id text, title text, rights text, content integer references Contents(rowID), "
    "summary integer references Contents(rowID), "
    "xmlRepresentation integer references Contents(rowID), dateUpdated real, datePublished real, "
    "dateCreated real, baseUrl text, alternateUrl text, author integer references Authors(rowID), "
    "feed integer references Feeds(rowID), current integer, tombstone integer, read integer, "
    "flagged integer, localDateCreated real, localDateUpdated real, localDateFlagsUpdated real)",
    "create table Enclosures (rowID integer not null unique primary key, "
    "entry integer references Entries(rowID), url text not null, mimeType text, length integer, "
    "downloadedPath text, downloadErrorDomain integer, downloadErrorCode integer)",
    "create table Authors (rowID integer not null unique primary key, name text, email text, "
    "url text, contactBookUid text)",
    "create table Contents (rowID integer not null unique primary key, data blob, mimeType text)",
    "create index Clients_signature on Clients(signature)",
    "create index Subscriptions_client on Subscriptions(client)",
    "create index Subscriptions_feed on Subscriptions(feed)",
    "create index Feeds_url on Feeds(url)",
    "create index Feeds_localDateUpdated on Feeds(localDateUpdated)",
    "create index Entries_identifier on Entries(identifier)",
    "create index Entries_current on Entries(current)",
    "create index Entries_dateCreated on Entries(dateCreated)",
    "create index Entries_datePublished on Entries(datePublished)",
    "create index Entries_dateUpdated on Entries(dateUpdated)",
    "create index Entries_draft on Entries(tombstone)",
    "create index Entries_edited on Entries(tombstone)",
    "create index Entries_feed on Entries(feed)",
    "create index Entries_flagged on Entries(flagged)",
    "create index Entries_localDateFlagsUpdated on Entries(localDateFlagsUpdated)",
    "create index Entries_localDateUpdated on Entries(localDateUpdated)",
    "create index Entries_read on Entries(read)",
    "create index Entries_title on Entries(title)",
    "create index Enclosures_entry on Enclosures(entry)",
};

const char kContent[] =
    "insert into Clients (rowID, signature, private) values (3, 'com.example.reader', 1);"
    "insert into Feeds (rowID, url, title) values (5, 'http://a/', 'A'), (6, 'http://b/', 'B');"
    "insert into Subscriptions (rowID, client, feed, refreshInterval) "
    "values (7, 3, 5, 300), (8, 3, 6, 0);"
    "insert into Contents (rowID, data, mimeType) values (9, x'616263', 'text/plain');"
    "insert into Entries (rowID, identifier, feed, title, content, read, localDateCreated) "
    "values (11, 'e1', 5, 'First', 9, 1, 100), (12, 'e2', 5, 'Second', null, 0, 300), "
    "(13, 'e3', 6, 'Third', null, 0, 200);"
    "insert into Enclosures (rowID, entry, url, length) values (15, 11, 'http://a/x', 1000)";

/// What led to version 10006, 10007 and so on.
const char* const kSteps[] = {
    "alter table Feeds add column rebuildXml integer;"
    "alter table Feeds add column feedFormat integer;"
    "alter table Entries add column rebuildXml integer",
    "alter table Feeds add column timeZoneUpdated integer;"
    "alter table Entries add column timeZoneUpdated integer;"
    "alter table Entries add column timeZonePublished integer;"
    "alter table Entries add column timeZoneCreated integer",
    "",
    "alter table Feeds add column linkLocalGuid text",
    "alter table Enclosures add column downloadState integer",
    "alter table Enclosures add column downloadAuditStatus integer",
    "alter table Feeds add column monkey blob",
    "alter table Subscriptions add column expirationDate number",
    "alter table Subscriptions add column unreadCount integer",
    "alter table Entries add column contentHash text;"
    "alter table Entries add column summaryHash text;"
    "alter table Entries add column xmlRepresentationHash text;"
    "alter table Entries add column localDateXmlChanged real;"
    "create index Entries_localDateXmlChanged on Entries(localDateXmlChanged)",
    "alter table Clients add column dateUsed real",
    "drop index Entries_current; drop index Entries_dateCreated;"
    "drop index Entries_datePublished; drop index Entries_dateUpdated; drop index Entries_draft;"
    "drop index Entries_edited; drop index Entries_feed; drop index Entries_flagged;"
    "drop index Entries_localDateFlagsUpdated; drop index Entries_localDateUpdated;"
    "drop index Entries_read; drop index Entries_title; drop index Subscriptions_client;"
    "drop index Subscriptions_feed;"
    "create index Enclosures_autodownloads on Enclosures(downloadState, downloadAuditStatus);"
    "create index Entries_tosync on Entries(localDateFlagsUpdated);"
    "create index Entries_unreadcount on Entries(feed, read, localDateCreated);"
    "create index Feeds_identifier on Feeds(identifier);"
    "create index Subscriptions_feedandclient on Subscriptions(feed, client);"
    "create index Subscriptions_nonbackground on "
    "Subscriptions(client, refreshesInBackground, refreshInterval)",
    "alter table Feeds add column recoverOldEntries integer",
    "alter table Feeds add column foafUrl text",
    "alter table Enclosures add column title text",
    "pragma auto_vacuum = incremental; vacuum",
    "alter table Feeds add column localDateCreatedOfNewestEntry REAL;"
    "update Feeds set localDateCreatedOfNewestEntry = "
    "(select max(localDateCreated) from Entries where feed = Feeds.rowID);"
    "CREATE TRIGGER Update_Feeds_localDateCreatedOfNewestEntryInFeed_After_Update AFTER UPDATE "
    "OF localDateCreated ON Entries BEGIN UPDATE Feeds SET localDateCreatedOfNewestEntry = "
    "MAX(localDateCreatedOfNewestEntry, NEW.localDateCreated) WHERE rowID = NEW.feed; END;"
    "CREATE TRIGGER Update_Feeds_localDateCreatedOfNewestEntryInFeed_After_Insert AFTER INSERT "
    "ON Entries BEGIN UPDATE Feeds SET localDateCreatedOfNewestEntry = "
    "MAX(localDateCreatedOfNewestEntry, NEW.localDateCreated) WHERE rowID = NEW.feed; END",
};

}  // namespace

void OldSchema::make(int version) {
    gDatabase->execute("PRAGMA synchronous = OFF");
    gDatabase->execute("begin");
    for (const char* table : kTables) {
        gDatabase->execute("%s", table);
    }
    gDatabase->execute("%s", kContent);
    gDatabase->execute("commit");
    for (int step = kOldest; step < version; ++step) {
        gDatabase->execute("%s", kSteps[step - kOldest]);
    }
    gDatabase->setUserVersion(version);
}
