// A real agent dies while it starts, and at every stage of a call.

#include "Agent/RPC/AgentFixture.h"
#include "Model/EntryCore.h"

#include <gtest/gtest.h>

#include <filesystem>

using namespace Foundation;
using namespace Orvane;

namespace {

struct Stage {
    const char* name;
    const char* line;      ///< that the agent is about to log
    bool isBeforeTheCall;  ///< the agent starts for the call
    std::int32_t code;     ///< of the error
    bool isSaved;          ///< what the call was to change
};

constexpr int kTimes = 10;

class IPCKill : public AgentFixture, public testing::WithParamInterface<Stage> {
 protected:
    IPCKill() { setProgram(MORTAL_AGENT " " + fatal); }

    /// Has the agent die when it is about to log the stage's line.
    void dieAtStage() const {
        directory.writeFile("next", std::string(GetParam().line) + "\n");
        std::filesystem::rename(directory / "next", fatal);
    }
    bool hasDied() const { return !std::filesystem::exists(fatal); }
    bool isRead(int row) const {
        return inFile(OVFormat("select read from Entries where rowID=%i", row)) != 0;
    }
    static NetError setRead(SQLite::RowID row) {
        return errorOf([&] { client().setFlags(&row, 1, 1, -1); });
    }

    Support::TempDir directory;
    const std::string fatal = directory / "fatal";
};

}  // namespace

TEST_P(IPCKill, GivesTheErrorAndTheNextCallStartsAnother) {
    openSession();
    for (int row = 1; row <= kTimes; ++row) {
        SCOPED_TRACE(row);
        if (!GetParam().isBeforeTheCall) client().startSkerrySync();
        dieAtStage();
        // Not the error of a time-out, so it came before that.
        EXPECT_EQ(setRead(row), NetError(1002, GetParam().code));
        EXPECT_TRUE(hasDied());
        EXPECT_EQ(agent(), 0) << "what was lost has been sent once more";
        EXPECT_EQ(isRead(row), GetParam().isSaved);
        // Of the row's cache, and of the file.
        EXPECT_FALSE(EntryCore::getRow(20)->mFlagged);
        EntryCore::getRow(20)->unload();
        EXPECT_FALSE(EntryCore::getRow(20)->mFlagged);
        EXPECT_EQ(setRead(row), NetError::None);
        EXPECT_TRUE(isRead(row));
        if (GetParam().isBeforeTheCall) killAgent();
    }
}

INSTANTIATE_TEST_SUITE_P(
    Stages, IPCKill,
    testing::Values(Stage{"Starting", "----- Orvane Agent STARTING", true, 202, false},
                    Stage{"Named", "Starting AgentTask", true, 203, false},
                    Stage{"Serving", "MIG server started", true, 203, false},
                    Stage{"Received", "Received Message \"entries_setflags\"", false, 203, false},
                    Stage{"Changed", "setFlags: Changed", false, 203, false},
                    Stage{"Saved", "...successful exit from OVMIGRoutineWrapper", false, 203,
                          true}),
    [](const auto& stage) { return std::string(stage.param.name); });

TEST_F(AgentFixture, ACallThatFindsTheAgentGoneIsMadeOfTheNextOne) {
    for (int i = 0; i < kTimes; ++i) {
        client().startSkerrySync();
        killAgent();
        const SQLite::RowID rows[] = {i + 1};
        EXPECT_EQ(errorOf([&] { client().setFlags(rows, 1, 1, -1); }), NetError::None);
        EXPECT_EQ(inFile(OVFormat("select read from Entries where rowID=%i", i + 1)), 1);
    }
}
