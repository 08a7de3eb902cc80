// A real agent is killed while it starts, and at every stage of a call.

#include "Agent/RPC/AgentFixture.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <atomic>
#include <csignal>
#include <fstream>
#include <mutex>
#include <thread>

using namespace Foundation;
using namespace Orvane;

namespace {

/// Reads what the agent logs, and kills it at a line that it waits for.
class Killer {
 public:
    explicit Killer(const std::string& directory)
        : mPIDFile(directory + "/pid"), mPipe(directory + "/log"), mScript(directory + "/agent") {
        mkfifo(mPipe.c_str(), 0600);
        std::ofstream(mScript) << "#!/bin/sh\necho $$ > " << mPIDFile
                               << "\nOVLog=1 OVLogIPC=1 OVLogAgent=1 exec " << ORVANE_AGENT
                               << " 2> " << mPipe << "\n";
        chmod(mScript.c_str(), 0700);
        mFD = open(mPipe.c_str(), O_RDWR | O_CLOEXEC);
        mReader = std::thread([this] { read(); });
    }
    ~Killer() {
        const std::string end = std::string(kEnd) + "\n";
        EXPECT_EQ(write(mFD, end.data(), end.size()), static_cast<ssize_t>(end.size()));
        mReader.join();
        close(mFD);
    }

    const std::string& script() const { return mScript; }
    void await(const std::string& line) {
        const std::lock_guard lock(mMutex);
        mLine = line;
    }
    int count() const { return mCount; }
    pid_t lastProcess() const { return mProcess; }

 private:
    static constexpr const char* kEnd = "end of the test";

    void read() {
        std::string text;
        char bytes[4096];
        for (ssize_t size; (size = ::read(mFD, bytes, sizeof(bytes))) > 0;) {
            text.append(bytes, static_cast<std::size_t>(size));
            if (text.find(kEnd) != std::string::npos) return;
            {
                const std::lock_guard lock(mMutex);
                if (!mLine.empty() && text.find(mLine) != std::string::npos) killNow();
            }
            text.erase(0, text.rfind('\n') + 1);
        }
    }
    void killNow() {
        mLine.clear();
        pid_t process = 0;
        std::ifstream(mPIDFile) >> process;
        mProcess = process;
        if (process > 0 && kill(process, SIGKILL) == 0) ++mCount;
    }

    const std::string mPIDFile;
    const std::string mPipe;
    const std::string mScript;
    int mFD = -1;
    std::mutex mMutex;
    std::string mLine;
    std::atomic<int> mCount = 0;
    std::atomic<pid_t> mProcess = 0;
    std::thread mReader;
};

struct Stage {
    const char* name;
    const char* line;
    bool isBeforeTheCall;  ///< the agent must start for the call
    std::int32_t code;     ///< of the error that is due, unless the agent was faster
};

constexpr int kTimes = 10;

class IPCKill : public AgentFixture, public testing::WithParamInterface<Stage> {
 protected:
    IPCKill() { setProgram(killer.script()); }

    Support::TempDir directory;
    Killer killer{directory.path().string()};
};

}  // namespace

TEST_P(IPCKill, GivesTheErrorAndTheNextCallStartsAnother) {
    for (int i = 0; i < kTimes; ++i) {
        SCOPED_TRACE(i);
        if (!GetParam().isBeforeTheCall) client().startSkerrySync();
        const int before = killer.count();
        killer.await(GetParam().line);
        const SQLite::RowID rows[] = {i + 1};
        const NetError error = errorOf([&] { client().setFlags(rows, 1, 1, -1); });
        // It may have been faster than its end.
        if (error != NetError(1002, GetParam().code) && error != NetError::None) {
            EXPECT_EQ(error, NetError(1002, OVIPCError));
        }
        await([&] { return killer.count() != before; });
        // Until the bus has noticed.
        await([&] { return agent() != killer.lastProcess(); });
        killer.await("");
        EXPECT_EQ(errorOf([&] { client().setFlags(rows, 1, 1, -1); }), NetError::None);
        EXPECT_EQ(inFile(OVFormat("select read from Entries where rowID=%i", i + 1)), 1);
        if (GetParam().isBeforeTheCall) killAgent();
    }
}

INSTANTIATE_TEST_SUITE_P(
    Stages, IPCKill,
    testing::Values(Stage{"Starting", "----- Orvane Agent STARTING", true, 202},
                    Stage{"Named", "Starting AgentTask", true, 203},
                    Stage{"Serving", "MIG server started", true, 203},
                    Stage{"Received", "Received Message \"entries_setflags\"", false, 203},
                    Stage{"Changed", "setFlags: Changed", false, 203},
                    Stage{"Saved", "...successful exit from OVMIGRoutineWrapper", false, 203}),
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
