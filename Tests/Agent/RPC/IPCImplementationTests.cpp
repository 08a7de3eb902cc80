// What the routines tell others beside the database. What they do to that is tried over the bus.

#include "Agent/IPCRoutines.h"
#include "Foundation/NetException.h"
#include "Model/EntryTest.h"
#include "Model/SyncPlanner.h"
#include "Support/AssertionOf.h"

#include <vector>

using namespace Foundation;
using namespace Orvane;
using Support::assertionOf;

namespace {

/// Keeps how many entries the log says were changed when it is asked for a sync.
class NotingPlanner : public SyncPlanner {
 public:
    explicit NotingPlanner(const Support::LogCapture& log) : mLog(log) { setCurrent(this); }
    ~NotingPlanner() override { setCurrent(nullptr); }
    void autoSyncSoon() override { logged.push_back(mLog.count("setFlags: Changed")); }
    std::vector<int> logged;

 private:
    const Support::LogCapture& mLog;
};

class IPCImplementation : public EntryTest {
 protected:
    static IPCBytes bytes(std::string_view text) {
        return {reinterpret_cast<const std::uint8_t*>(text.data()), text.size()};
    }

    Support::LogCapture log;
    const Support::LoggingOn on{{&gLogIPC}};
    NotingPlanner planner{log};
};

}  // namespace

TEST_F(IPCImplementation, SetFlagsLogsHowManyItHasChangedAndPlansASync) {
    const Ref<SubscriptionCore> subscription = subscribe("com.example.reader");
    const std::vector<std::int64_t> rows = {
        storedEntry("a")->getRowID(), storedEntry("b")->getRowID(), storedEntry("c")->getRowID()};
    feed->updateUnreadCounts();
    EntryCore::getRow(rows[1])->setRead(true);
    ipc_impl_entries_setflags(rows, 1, -1);
    EXPECT_TRUE(log.contains("[IPC] setFlags: Changed 2 of 3 entries to (read=1, flagged=-1)"));
    EXPECT_EQ(planner.logged, std::vector<int>{1});
    EXPECT_EQ(subscription->mUnreadCount, 0);
    ipc_impl_entries_setflags({}, 0, 0);
    EXPECT_TRUE(log.contains("[IPC] setFlags: Changed 0 of 0 entries to (read=0, flagged=0)"));
    EXPECT_EQ(planner.logged.size(), 2u);
}

TEST_F(IPCImplementation, SetFlagsPlansNothingForAnEntryThatIsNotThere) {
    const std::vector<std::int64_t> rows = {storedEntry("a")->getRowID(), 99};
    EXPECT_THROW(ipc_impl_entries_setflags(rows, 1, 1), NetException);
    EXPECT_FALSE(EntryCore::getRow(rows[0])->mRead);
    EXPECT_FALSE(EntryCore::getRow(rows[0])->isChanged());
    EXPECT_FALSE(log.contains("setFlags: Changed"));
    EXPECT_TRUE(planner.logged.empty());
}

TEST_F(IPCImplementation, SettersPlanASyncEach) {
    const Ref<EntryCore> entry = storedEntry("a");
    ipc_impl_entry_setRead(entry->getRowID(), true);
    ipc_impl_entry_setFlagged(entry->getRowID(), true);
    EXPECT_EQ(planner.logged.size(), 2u);
    db().saveRows();
}

TEST_F(IPCImplementation, SubscriptionCreateLogsBeforeItLooksForTheClient) {
    std::int64_t made = 0;
    EXPECT_THROW(
        ipc_impl_subscription_create(99, 0, bytes("http://example.org/1"), {}, {}, {}, made),
        NetException);
    EXPECT_TRUE(log.contains("[IPC] Create new Subscription on <http://example.org/1>"));
    log.clear();
    EXPECT_EQ(assertionOf([&] {
                  ipc_impl_subscription_create(99, 1, bytes("http://example.org/1"), {}, {}, {},
                                               made);
              }),
              "!publishingProtocol");
    EXPECT_FALSE(log.contains("Create new Subscription"));
}

TEST_F(IPCImplementation, SubscriptionDeleteNamesTheSettingsThatItSpares) {
    const Ref<SubscriptionCore> subscription = subscribe("com.example.reader");
    const Ref<SubscriptionCore> settings = subscription->getClient()->getDefaultSubscription();
    const std::int64_t row = settings->getRowID();
    EXPECT_EQ(assertionOf([&] { ipc_impl_subscription_delete(row); }),
              "Can't delete magic client-settings Subscription");
    EXPECT_EQ(count(OVFormat("Subscriptions where rowID=%lli", row).c_str()), 1);
}
