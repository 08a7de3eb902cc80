#include "Foundation/AssertionFailure.h"
#include "Foundation/NetException.h"
#include "Model/EntryTest.h"
#include "Model/SyncPlanner.h"

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;
using Support::LogCapture;

namespace {

class CountingPlanner : public SyncPlanner {
 public:
    CountingPlanner() { setCurrent(this); }
    ~CountingPlanner() override { setCurrent(nullptr); }
    void autoSyncSoon() override { ++planned; }
    int planned = 0;
};

class EntryFlagsTest : public EntryTest {
 protected:
    double flagsDate() const { return Date::getAbsoluteTime(entry->mLocalDateFlagsUpdated); }
    /// The same entry in a process that only reads.
    Ref<EntryCore> readOnly() {
        const RowID rowID = entry->getRowID();
        reopen(false);
        return EntryCore::getRow(rowID);
    }

    const Ref<SubscriptionCore> subscription = subscribe("com.example.reader");
    const Ref<EntryCore> entry = storedEntry("abc");
};

}  // namespace

TEST_F(EntryFlagsTest, ReadingItDatesTheChangeAndCountsAnew) {
    feed->updateUnreadCounts();
    EXPECT_EQ(subscription->mUnreadCount, 1);
    entry->setRead(true);
    EXPECT_TRUE(entry->mRead);
    EXPECT_EQ(flagsDate(), clock.now());
    EXPECT_EQ(subscription->mUnreadCount, 0);
    EXPECT_EQ(count("Subscriptions where unreadCount=0"), 1);
}

TEST_F(EntryFlagsTest, ThePresentValueChangesNothing) {
    entry->setRead(false);
    entry->setFlagged(false);
    EXPECT_FALSE(entry->isChanged());
    EXPECT_EQ(entry->mLocalDateFlagsUpdated.getValue(), nullptr);
    // Also where the row has not been read yet.
    entry->unload();
    entry->setRead(false);
    entry->setFlagged(false);
    EXPECT_FALSE(entry->changeFlags(false, false, true));
    EXPECT_FALSE(entry->isChanged());
}

TEST_F(EntryFlagsTest, FlaggingItDatesTheChange) {
    entry->setFlagged(true);
    EXPECT_TRUE(entry->mFlagged);
    EXPECT_EQ(flagsDate(), clock.now());
}

TEST_F(EntryFlagsTest, AnEntryWithoutAFeedCountsNothing) {
    const Ref<EntryCore> ghost = EntryCore::createGhostEntry(str("0123"));
    ghost->setRead(true);
    EXPECT_TRUE(ghost->mRead);
    EXPECT_TRUE(ghost->changeFlags(false, true, true));
}

TEST_F(EntryFlagsTest, ChangesBothWithOneDate) {
    feed->updateUnreadCounts();
    EXPECT_TRUE(entry->changeFlags(true, true, false));
    EXPECT_TRUE(entry->mRead && entry->mFlagged);
    EXPECT_EQ(flagsDate(), clock.now());
    EXPECT_EQ(subscription->mUnreadCount, 1);
    EXPECT_TRUE(entry->changeFlags(false, true, true));
    EXPECT_FALSE(entry->mRead);
    EXPECT_TRUE(entry->changeFlags(true, true, true));
    EXPECT_EQ(subscription->mUnreadCount, 0);
    EXPECT_TRUE(entry->changeFlags(true, false, true));
    EXPECT_TRUE(entry->mRead);
    EXPECT_FALSE(entry->mFlagged);
}

TEST_F(EntryFlagsTest, AClientsWriteGoesToTheRowWhereItMayBeChanged) {
    RecordingAgent agent;
    EXPECT_TRUE(entry->public_setRead(true));
    EXPECT_TRUE(entry->public_setFlagged(true));
    EXPECT_TRUE(entry->mRead && entry->mFlagged);
    EXPECT_EQ(agent.calls, "");
}

TEST_F(EntryFlagsTest, AClientsWriteGoesByTheAgentAndIsReadAnew) {
    const Ref<EntryCore> read = readOnly();
    RecordingAgent agent;
    EXPECT_FALSE(read->mRead.getValue());
    EXPECT_TRUE(read->public_setRead(true));
    EXPECT_TRUE(read->public_setFlagged(true));
    EXPECT_EQ(agent.calls, "setRead(1,1) setFlagged(1,1) ");
    EXPECT_FALSE(read->mRead.isLoaded());
    EXPECT_FALSE(read->mFlagged.isLoaded());
    EXPECT_TRUE(read->mTitle.isLoaded());
    // As the file has it still.
    EXPECT_FALSE(read->mRead.getValue());
}

TEST_F(EntryFlagsTest, AWriteThatTheAgentCannotDoThrows) {
    const LogCapture log;
    const Ref<EntryCore> read = readOnly();
    EXPECT_THROW(read->public_setRead(true), NetException);
    EXPECT_THROW(read->public_setFlagged(true), NetException);
}

TEST_F(EntryFlagsTest, AClientMayChangeOnlyTheFlags) {
    for (int column = 0; column <= EntryCore::LocalDateFlagsUpdated; ++column) {
        if (column == 22 || column == 23) {
            EXPECT_NO_THROW(entry->ipcWillChangeColumn(column));
            continue;
        }
        try {
            entry->ipcWillChangeColumn(column);
            ADD_FAILURE() << "column " << column;
        } catch (const NetException& exception) {
            EXPECT_EQ(exception.getError(), NetError(1002, 201));
        }
    }
}

TEST_F(EntryFlagsTest, AChangeByAClientPlansASync) {
    CountingPlanner planner;
    entry->ipcDidChangeColumn(EntryCore::Read);
    entry->ipcDidChangeColumn(EntryCore::Flagged);
    EXPECT_EQ(planner.planned, 2);
    const LogCapture log;
    try {
        entry->ipcDidChangeColumn(EntryCore::Title);
        FAIL();
    } catch (const AssertionFailure& failure) {
        EXPECT_STREQ(failure.what(), "col == ColumnID::Read || col == ColumnID::Flagged");
    }
    EXPECT_EQ(planner.planned, 2);
}

TEST_F(EntryFlagsTest, AChangeWithNobodyToSyncIsFine) {
    const LogCapture log;
    EXPECT_NO_THROW(entry->ipcDidChangeColumn(EntryCore::Read));
}
