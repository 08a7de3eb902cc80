// Each routine of a real agent, called over the bus with good arguments and bad ones.

#include "Agent/RPC/AgentFixture.h"
#include "Foundation/Bus.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <numeric>
#include <vector>

using namespace Foundation;
using namespace Orvane;

namespace {

class IPCRoutine : public AgentFixture {
 protected:
    using Bytes = std::span<const std::uint8_t>;
    using Rows = std::span<const std::int64_t>;

    // Some calls are long ones where a sanitizer looks on.
    IPCRoutine() : mPort(port()) { gOrvaneIPCTimeoutMS = 300'000; }
    ~IPCRoutine() noexcept override { gOrvaneIPCTimeoutMS = 30'000; }

    /// Changes the file, before the agent has been started.
    void write(const std::string& statements) const {
        ASSERT_EQ(agent(), 0);
        SQLite::Database writer;
        writer.open(path.c_str(), true);
        writer.execute("%s", statements.c_str());
        writer.close(true);
    }

    template <class Routine, class... Arguments>
    std::int32_t call(const Routine& routine, Arguments&&... arguments) {
        return routine(mPort, arguments...);
    }
    std::int64_t createAuthor(const char* name, const char* uid) {
        std::int64_t author = -1;
        EXPECT_EQ(
            call(RPC::ipc_author_create, bytes(name), Bytes(), Bytes(), std::string(uid), author),
            0);
        return author;
    }

 private:
    std::uint32_t mPort;
};

}  // namespace

TEST_F(IPCRoutine, FixDatabaseLeavesAHealthyDatabaseAlone) {
    for (const int code : {5, 12, 17, 11, 26}) {
        EXPECT_EQ(call(RPC::ipc_fix_database, code), 0) << code;
    }
    EXPECT_EQ(inFile("select count(*) from Entries"), 20);
}

TEST_F(IPCRoutine, GetSocketPathKnowsNoOtherNameThanRender) {
    for (const char* name : {"", "render", "Other"}) {
        std::string answer = "?";
        EXPECT_EQ(call(RPC::ipc_get_socket_path, std::string(name), answer), 0);
        EXPECT_EQ(answer, "");
    }
}

TEST_F(IPCRoutine, StartSkerrySyncStartsNothingYet) {
    std::int32_t started = -1;
    EXPECT_EQ(call(RPC::ipc_start_skerry_sync, started), 0);
    EXPECT_EQ(started, 0);
}

TEST_F(IPCRoutine, ClientCreateMakesEachClientOnce) {
    std::int64_t client = 0;
    EXPECT_EQ(call(RPC::ipc_client_create, std::string("org.example.Reader"), client), 0);
    EXPECT_EQ(client, 1);
    EXPECT_EQ(call(RPC::ipc_client_create, std::string("org.example.Other"), client), 0);
    EXPECT_EQ(client, 2);
    EXPECT_EQ(inFile("select count(*) from Subscriptions where client=2"), 1);
    EXPECT_EQ(call(RPC::ipc_client_create, std::string("org.example.Other"), client), 0);
    EXPECT_EQ(client, 2);
    EXPECT_EQ(call(RPC::ipc_client_create, std::string(), client), kFailed);
    EXPECT_EQ(call(RPC::ipc_client_create, std::string(255, 'x'), client), 0);
    EXPECT_EQ(call(RPC::ipc_client_create, std::string(256, 'x'), client),
              MachError::kBadArguments);
}

TEST_F(IPCRoutine, ClientMarkInUseNotesTheUse) {
    EXPECT_EQ(call(RPC::ipc_client_markInUse, 1), 0);
    EXPECT_EQ(inFile("select dateUsed > 1 from Clients where rowID=1"), 1);
    EXPECT_EQ(call(RPC::ipc_client_markInUse, 9), kBadRow);
}

TEST_F(IPCRoutine, ClientExpireAllExpiresWhatIsThere) {
    EXPECT_EQ(call(RPC::ipc_client_expireAll, 1), 0);
    EXPECT_EQ(inFile("select count(*) from Subscriptions where expirationDate > 1000"), 3);
    EXPECT_EQ(call(RPC::ipc_client_expireAll, 9), kBadRow);
}

TEST_F(IPCRoutine, ClientSetPrivateSetsTheColumn) {
    EXPECT_EQ(call(RPC::ipc_client_setPrivate, 1, true), 0);
    EXPECT_EQ(inFile("select private from Clients where rowID=1"), 1);
    EXPECT_EQ(call(RPC::ipc_client_setPrivate, 9, true), kBadRow);
}

TEST_F(IPCRoutine, SubscriptionCreateGivesTheSubscriptionOfTheFeed) {
    std::int64_t client = 0;
    std::int64_t made = 0;
    EXPECT_EQ(call(RPC::ipc_client_create, std::string("org.example.Other"), client), 0);
    const auto create = [&](std::int64_t to, const char* address, int protocol = 0) {
        made = -1;
        return call(RPC::ipc_subscription_create, to, static_cast<std::uint8_t>(protocol),
                    bytes(address), Bytes(), Bytes(), Bytes(), made);
    };
    EXPECT_EQ(create(client, "http://example.org/1"), 0);
    EXPECT_EQ(inFile("select feed from Subscriptions where client=2 and feed!=0"), 1);
    EXPECT_EQ(made, inFile("select rowID from Subscriptions where client=2 and feed=1"));
    EXPECT_EQ(create(1, "http://example.org/1"), 0);
    EXPECT_EQ(made, 2);
    EXPECT_EQ(create(client, "file:///nowhere/2"), 0) << "the same files are seen here";
    EXPECT_GT(made, 0);
    EXPECT_EQ(create(client, "unheard-of:feed"), 0);
    EXPECT_EQ(made, 0);
    EXPECT_EQ(create(9, "http://example.org/1"), kBadRow);
    EXPECT_EQ(create(client, "http://example.org/1", 1), kFailed);
    EXPECT_EQ(create(client, ""), kFailed);
    EXPECT_EQ(create(client, "\xff"), kFailed);
}

TEST_F(IPCRoutine, SubscriptionSetSetsAllSix) {
    EXPECT_EQ(call(RPC::ipc_subscription_set, 2, 600, 86400, false, true, std::uint64_t{1} << 40,
                   bytes("audio/mpeg\tvideo/mp4")),
              0);
    EXPECT_EQ(textInFile("select refreshInterval||' '||expirationInterval||' '||"
                         "refreshesInBackground||' '||downloadsEnclosures||' '||maxEnclosureSize"
                         "||' '||replace(enclosureTypesString,char(9),',')"
                         " from Subscriptions where rowID=2"),
              "600.0 86400.0 0 1 1099511627776.0 audio/mpeg,video/mp4");
    EXPECT_EQ(call(RPC::ipc_subscription_set, 9, 0, 0, false, false, 0, Bytes()), kBadRow);
    EXPECT_EQ(call(RPC::ipc_subscription_set, 2, 0, 0, false, false, 0, bytes("\xff")), kFailed);
}

TEST_F(IPCRoutine, SubscriptionDeleteDeletesAllButTheSettings) {
    EXPECT_EQ(call(RPC::ipc_subscription_delete, 1), kFailed);
    EXPECT_EQ(call(RPC::ipc_subscription_delete, 3), 0);
    EXPECT_EQ(inFile("select count(*) from Subscriptions"), 2);
    EXPECT_EQ(inFile("select count(*) from Feeds"), 1);
    EXPECT_EQ(inFile("select dateUsed > 1 from Clients where rowID=1"), 1);
    EXPECT_EQ(call(RPC::ipc_subscription_delete, 3), kBadRow);
}

TEST_F(IPCRoutine, SubscriptionSettersSetTheirColumns) {
    EXPECT_EQ(call(RPC::ipc_subscription_setRefreshInterval, 2, 700), 0);
    EXPECT_EQ(call(RPC::ipc_subscription_setExpirationInterval, 2, 800), 0);
    EXPECT_EQ(call(RPC::ipc_subscription_setRefreshesInBackground, 2, false), 0);
    EXPECT_EQ(call(RPC::ipc_subscription_setDownloadsEnclosures, 2, true), 0);
    EXPECT_EQ(call(RPC::ipc_subscription_setMaxEnclosureSize, 2, 900), 0);
    EXPECT_EQ(textInFile("select refreshInterval||' '||expirationInterval||' '||"
                         "refreshesInBackground||' '||downloadsEnclosures||' '||maxEnclosureSize"
                         " from Subscriptions where rowID=2"),
              "700.0 800.0 0 1 900.0");
    EXPECT_EQ(call(RPC::ipc_subscription_setRefreshInterval, 9, 1), kBadRow);
    EXPECT_EQ(call(RPC::ipc_subscription_setExpirationInterval, 9, 1), kBadRow);
    EXPECT_EQ(call(RPC::ipc_subscription_setRefreshesInBackground, 9, true), kBadRow);
    EXPECT_EQ(call(RPC::ipc_subscription_setDownloadsEnclosures, 9, true), kBadRow);
    EXPECT_EQ(call(RPC::ipc_subscription_setMaxEnclosureSize, 9, 1), kBadRow);
}

TEST_F(IPCRoutine, FeedRefreshGivesADomainAtMost) {
    write("insert into Feeds (rowID,url,identifier) values (3,'gopher://example.org/3','f3')");
    std::int64_t domain = -1;
    EXPECT_EQ(call(RPC::ipc_feed_refresh, 1, true, domain), 0);
    EXPECT_EQ(domain, 0);
    EXPECT_EQ(call(RPC::ipc_feed_refresh, 3, true, domain), 0);
    EXPECT_EQ(domain, NetError::kPFURL) << "it could not be started";
    EXPECT_EQ(call(RPC::ipc_feed_refresh, 9, true, domain), kBadRow);
}

TEST_F(IPCRoutine, FeedRefreshMultipleGoesOnBehindAFeedThatIsNotThere) {
    const std::vector<std::int64_t> feeds = {9, 1, -5, 2};
    EXPECT_EQ(call(RPC::ipc_feed_refreshMultiple, Rows(feeds), false), 0);
    EXPECT_EQ(call(RPC::ipc_feed_refreshMultiple, Rows(), false), 0);
}

TEST_F(IPCRoutine, FeedRecoverOldEntriesAsksTheFeed) {
    EXPECT_EQ(call(RPC::ipc_feed_recoverOldEntries, 1), 0);
    EXPECT_EQ(call(RPC::ipc_feed_recoverOldEntries, 9), kBadRow);
}

TEST_F(IPCRoutine, FeedSetLoginSetsAndClearsTheColumn) {
    EXPECT_EQ(call(RPC::ipc_feed_setLogin, 1, bytes("ann")), 0);
    EXPECT_EQ(textInFile("select login from Feeds where rowID=1"), "ann");
    EXPECT_EQ(call(RPC::ipc_feed_setLogin, 1, Bytes()), 0);
    EXPECT_EQ(textInFile("select login from Feeds where rowID=1"), "none");
    EXPECT_EQ(call(RPC::ipc_feed_setLogin, 9, bytes("ann")), kBadRow);
    EXPECT_EQ(call(RPC::ipc_feed_setLogin, 1, bytes("\xc3")), kFailed);
}

TEST_F(IPCRoutine, EntrySetContentSetsAndClearsEachText) {
    for (const char* column : {"content", "summary", "XMLRepresentation"}) {
        EXPECT_EQ(call(RPC::ipc_entry_setContent, 1, std::string(column), bytes("text/plain"),
                       bytes(column)),
                  0);
        EXPECT_EQ(textInFile(std::string("select mimeType||' '||data from Contents where rowID="
                                         "(select ") +
                             column + " from Entries where rowID=1)"),
                  std::string("text/plain ") + column);
    }
    EXPECT_EQ(inFile("select count(*) from Contents"), 3);
    EXPECT_EQ(call(RPC::ipc_entry_setContent, 1, std::string("content"), Bytes(), Bytes()), 0);
    EXPECT_EQ(inFile("select count(*) from Contents"), 2);
    EXPECT_EQ(
        call(RPC::ipc_entry_setContent, 1, std::string("title"), bytes("text/plain"), bytes("x")),
        kFailed);
    EXPECT_EQ(call(RPC::ipc_entry_setContent, 99, std::string("content"), Bytes(), Bytes()),
              kBadRow);
    EXPECT_EQ(call(RPC::ipc_entry_setContent, 1, std::string(20, 'x'), Bytes(), Bytes()),
              MachError::kBadArguments);
}

TEST_F(IPCRoutine, EntrySetAuthorTakesZeroForNone) {
    EXPECT_EQ(call(RPC::ipc_entry_setAuthor, 1, 1), 0);
    EXPECT_EQ(inFile("select author from Entries where rowID=1"), 1);
    EXPECT_EQ(call(RPC::ipc_entry_setAuthor, 1, 0), 0);
    EXPECT_EQ(inFile("select count(*) from Entries where author > 0"), 0);
    EXPECT_EQ(call(RPC::ipc_entry_setAuthor, 1, 9), kBadRow);
    EXPECT_EQ(call(RPC::ipc_entry_setAuthor, 99, 1), kBadRow);
}

TEST_F(IPCRoutine, EntriesSetFlagsLeavesAloneWhatIsBelowZero) {
    const std::vector<std::int64_t> rows = {1, 2, 3};
    EXPECT_EQ(call(RPC::ipc_entries_setflags, Rows(rows), 1, -1), 0);
    EXPECT_EQ(inFile("select count(*) from Entries where read=1 and flagged=0"), 3);
    EXPECT_EQ(call(RPC::ipc_entries_setflags, Rows(rows).first(2), -1, 7), 0);
    EXPECT_EQ(inFile("select count(*) from Entries where read=1 and flagged=1"), 2);
    EXPECT_EQ(call(RPC::ipc_entries_setflags, Rows(rows).first(1), 0, -1), 0);
    EXPECT_EQ(inFile("select count(*) from Entries where read=1"), 2);
    EXPECT_EQ(call(RPC::ipc_entries_setflags, Rows(), 1, 1), 0);
    EXPECT_EQ(inFile("select count(*) from Entries where read=1"), 2);
}

TEST_F(IPCRoutine, EntriesSetFlagsChangesAllOrNone) {
    const std::vector<std::int64_t> rows = {1, 2, 99};
    EXPECT_EQ(call(RPC::ipc_entries_setflags, Rows(rows), 1, 1), kBadRow);
    EXPECT_EQ(inFile("select count(*) from Entries where read=1 or flagged=1"), 0);
    // Nor does what was refused come with what is accepted.
    const std::vector<std::int64_t> other = {5};
    EXPECT_EQ(call(RPC::ipc_entries_setflags, Rows(other), 1, -1), 0);
    EXPECT_EQ(textInFile("select group_concat(rowID) from Entries where read=1 or flagged=1"), "5");
    EXPECT_EQ(inFile("select unreadCount from Subscriptions where rowID=2"), 19);
}

TEST_F(IPCRoutine, EntriesSetFlagsTakesAsManyRowsAsAPeerMaySend) {
    const std::vector<std::int64_t> rows(RPC::kMaximumRowIDs, 1);
    EXPECT_EQ(call(RPC::ipc_entries_setflags, Rows(rows), 1, 1), 0);
    EXPECT_EQ(inFile("select count(*) from Entries where read=1 and flagged=1"), 1);
    EXPECT_EQ(inFile("select unreadCount from Subscriptions where rowID=2"), 19);
}

TEST_F(IPCRoutine, EntriesSetFlagsCountsALongFeedOnce) {
    const int count = std::getenv("ORVANE_SLOW_TESTS") ? 100'000 : 5'000;
    write(
        OVFormat("with recursive n(i) as (select 21 union all select i+1 from n where i<%d)"
                 " insert into Entries (rowID,identifier,feed,current,read,flagged,"
                 "localDateCreated) select i,'e'||i,1,1,0,0,1000 from n",
                 count));
    std::vector<std::int64_t> rows(static_cast<std::size_t>(count));
    std::iota(rows.begin(), rows.end(), 1);
    EXPECT_EQ(call(RPC::ipc_entries_setflags, Rows(rows), 1, 1), 0);
    EXPECT_EQ(inFile("select count(*) from Entries where read=1 and flagged=1"), count);
    EXPECT_EQ(inFile("select unreadCount from Subscriptions where rowID=2"), 0);
}

TEST_F(IPCRoutine, WhatCannotBeSavedIsAnError) {
    write("create trigger refuse before update on Entries begin select raise(abort, 'no'); end");
    EXPECT_EQ(call(RPC::ipc_entry_setFlagged, 1, true), kFailed);
    EXPECT_EQ(inFile("select flagged from Entries where rowID=1"), 0);
}

TEST_F(IPCRoutine, EnclosureActionTakesAnyNumber) {
    for (const int action : {0, 1, 2, 3, 7, -1}) {
        std::int32_t handled = 0;
        EXPECT_EQ(call(RPC::ipc_enclosure_action, 1, action, handled), 0) << action;
        EXPECT_EQ(handled, 1);
    }
    std::int32_t handled = 0;
    EXPECT_EQ(call(RPC::ipc_enclosure_action, 9, 0, handled), kBadRow);
}

TEST_F(IPCRoutine, AuthorCreateGivesEqualAuthorsOneRow) {
    EXPECT_EQ(createAuthor("", "uid"), 0);
    EXPECT_EQ(createAuthor("Ann", "uid"), 1);
    EXPECT_EQ(createAuthor("Bob", "uid"), 2);
    EXPECT_EQ(createAuthor("Bob", "other"), 2);
    EXPECT_EQ(textInFile("select contactBookUid from Authors where rowID=2"), "uid");
    std::int64_t author = 0;
    EXPECT_EQ(call(RPC::ipc_author_create, Bytes(), bytes("b@example.org"),
                   bytes("http://example.org/"), std::string(), author),
              0);
    EXPECT_EQ(author, 3);
    EXPECT_EQ(textInFile("select email||' '||url from Authors where rowID=3"),
              "b@example.org http://example.org/");
    EXPECT_EQ(call(RPC::ipc_author_create, bytes("\xff"), Bytes(), Bytes(), std::string(), author),
              kFailed);
}

TEST_F(IPCRoutine, AuthorSetContactBookUIDSetsAndClearsTheColumn) {
    EXPECT_EQ(call(RPC::ipc_author_setContactBookUID, 1, std::string("uid")), 0);
    EXPECT_EQ(textInFile("select contactBookUid from Authors where rowID=1"), "uid");
    EXPECT_EQ(call(RPC::ipc_author_setContactBookUID, 1, std::string()), 0);
    EXPECT_EQ(textInFile("select contactBookUid from Authors where rowID=1"), "none");
    EXPECT_EQ(call(RPC::ipc_author_setContactBookUID, 9, std::string()), kBadRow);
}

TEST_F(IPCRoutine, EntrySettersSetTheirFlags) {
    EXPECT_EQ(call(RPC::ipc_entry_setRead, 1, true), 0);
    EXPECT_EQ(call(RPC::ipc_entry_setFlagged, 2, true), 0);
    EXPECT_EQ(inFile("select read from Entries where rowID=1"), 1);
    EXPECT_EQ(inFile("select flagged from Entries where rowID=2"), 1);
    EXPECT_EQ(call(RPC::ipc_entry_setRead, 1, false), 0);
    EXPECT_EQ(inFile("select read from Entries where rowID=1"), 0);
    EXPECT_EQ(call(RPC::ipc_entry_setRead, 99, true), kBadRow);
    EXPECT_EQ(call(RPC::ipc_entry_setFlagged, 99, true), kBadRow);
    EXPECT_EQ(call(RPC::ipc_entry_setRead, 0, true), kFailed);
    EXPECT_EQ(call(RPC::ipc_entry_setRead, -1, true), kFailed);
}

TEST_F(IPCRoutine, MoreThanAPeerMaySendIsRefused) {
    const std::vector<std::int64_t> rows(100'001, 1);
    EXPECT_EQ(call(RPC::ipc_entries_setflags, Rows(rows), 1, 1), kFailed);
    EXPECT_EQ(call(RPC::ipc_feed_refreshMultiple, Rows(rows), true), kFailed);
    const std::string text(16 * 1024 * 1024 + 1, 'x');
    EXPECT_EQ(call(RPC::ipc_feed_setLogin, 1, bytes(text)), kFailed);
    EXPECT_EQ(call(RPC::ipc_entry_setContent, 1, std::string("content"), Bytes(), bytes(text)),
              kFailed);
    EXPECT_EQ(inFile("select count(*) from Entries where read=1"), 0);
    EXPECT_EQ(textInFile("select login from Feeds where rowID=1"), "none");
}
