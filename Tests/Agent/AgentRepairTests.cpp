// What the agent does about a database that is broken, or is said to be.

#include "Agent/AgentTest.h"
#include "Foundation/DictionaryOf.h"
#include "SQLite/Exception.h"

#include <gmock/gmock.h>

#include <fstream>

using namespace Foundation;
using namespace Orvane;

namespace {

class AgentRepairTest : public AgentTest {
 protected:
    AgentRepairTest() { startAgent(); }

    /// Takes all rows out of an index of the file.
    void emptyIndex(const char* name) {
        const int root =
            db().execScalar("select rootpage from sqlite_master where name = '%s'", name);
        const int size = db().execScalar("PRAGMA page_size");
        db().close(true);
        std::fstream file(storage() / "Database/Database.sqlite3",
                          std::ios::in | std::ios::out | std::ios::binary);
        const char header[] = {
            10, 0, 0, 0, 0, static_cast<char>(size >> 8), static_cast<char>(size & 0xFF), 0};
        file.seekp(static_cast<std::streamoff>(root - 1) * size);
        file.write(header, sizeof header);
        file.close();
        db().open((storage() / "Database/Database.sqlite3").c_str(), true);
    }

    void sayBroken(Dictionary* info) {
        post(SQLite::Database::kDatabaseFatalErrorNotification, SQLite::gDatabase, info);
    }
};

TEST_F(AgentRepairTest, MakesABrokenDatabaseAnew) {
    const Ref<String> key = String::string("message");
    const Ref<String> text = String::string("the disk has holes");
    const Ref<Dictionary> info = DictionaryOf<String, String>::dictionary({{key, text}});
    const std::uint32_t generation = db().getGeneration();
    sayBroken(info);
    EXPECT_EQ(log.lines().front(), "[WARNING] AgentTask: Notified of fatal database error");
    EXPECT_TRUE(log.contains("Moving aside and rebuilding"));
    EXPECT_NE(db().getGeneration(), generation);
    EXPECT_TRUE(db().isOpen());
}

TEST_F(AgentRepairTest, NeedsNoReason) {
    const std::uint32_t generation = db().getGeneration();
    sayBroken(nullptr);
    EXPECT_NE(db().getGeneration(), generation);
}

TEST_F(AgentRepairTest, LeavesOtherDatabasesAlone) {
    SQLite::Database other;
    const std::uint32_t generation = db().getGeneration();
    post(SQLite::Database::kDatabaseFatalErrorNotification, &other);
    EXPECT_EQ(db().getGeneration(), generation);
    EXPECT_FALSE(log.contains("Notified"));
}

class HarmlessCode : public AgentRepairTest, public testing::WithParamInterface<int> {};

TEST_P(HarmlessCode, NeedsNoLookAtTheDatabase) {
    const Support::LoggingOn sql({&SQLite::gLogSQL});
    const std::uint32_t generation = db().getGeneration();
    task->fixDatabaseRequested(GetParam());
    EXPECT_EQ(log.lines().front(),
              OVFormat("[Agent] FixDatabase called! errorCode=%i", GetParam()));
    EXPECT_EQ(log.lines().size(), 1u);
    EXPECT_EQ(db().getGeneration(), generation);
}

// Busy, no file, an old schema.
INSTANTIATE_TEST_SUITE_P(Repair, HarmlessCode, testing::Values(5, 12, 17));

class OtherCode : public AgentRepairTest, public testing::WithParamInterface<int> {};

TEST_P(OtherCode, LeavesAHealthyDatabaseAlone) {
    const Support::LoggingOn sql({&SQLite::gLogSQL});
    const std::uint32_t generation = db().getGeneration();
    task->fixDatabaseRequested(GetParam());
    EXPECT_TRUE(log.contains("integrity_check"));
    EXPECT_EQ(db().getGeneration(), generation);
    EXPECT_FALSE(log.contains("fixDatabaseRequested(int)"));
}

INSTANTIATE_TEST_SUITE_P(Repair, OtherCode, testing::Values(0, 1, 4, 6, 10, 11, 13, 16, 18, 26));

TEST_F(AgentRepairTest, MakesADatabaseAnewThatIsBrokenIndeed) {
    subscribe("http://example.org/1");
    emptyIndex("Feeds_url");
    log.clear();
    task->fixDatabaseRequested(11);
    EXPECT_TRUE(log.contains("void Orvane::AgentTask::fixDatabaseRequested(int)"));
    EXPECT_TRUE(db().isOpen());
    EXPECT_NO_THROW(db().integrityCheck());
    // The row store has announced it too, which is not to make the new one anew.
    clock.advanceBy(1);
    EXPECT_EQ(log.count("Moving aside and rebuilding"), 1);
}

TEST_F(AgentRepairTest, MakesADatabaseAnewThatTheRowStoreFindsBroken) {
    subscribe("http://example.org/1");
    emptyIndex("Feeds_url");
    log.clear();
    EXPECT_THROW(db().integrityCheck(), SQLite::Exception);
    clock.advanceBy(1);
    EXPECT_TRUE(log.contains("[WARNING] AgentTask: Notified of fatal database error"));
    EXPECT_EQ(log.count("Moving aside and rebuilding"), 1);
    EXPECT_NO_THROW(db().integrityCheck());
}

}  // namespace
