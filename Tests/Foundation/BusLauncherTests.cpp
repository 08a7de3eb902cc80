#include "Foundation/BusLauncher.h"

#include "Foundation/BusPeer.h"
#include "Foundation/UniqueFD.h"
#include "Support/EnvVar.h"
#include "Support/PipedChild.h"
#include "Support/TempDir.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <poll.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <csignal>
#include <filesystem>

using namespace Foundation;
using Support::EnvVar;
using Support::PipedChild;
using Support::TempDir;

namespace {

/// An account of its own where no bus runs.
class BusLauncherTest : public testing::Test {
 protected:
    ~BusLauncherTest() override {
        if (access(socket.c_str(), F_OK) == 0) endDaemon();
    }
    pid_t daemon() {
        BusPeer peer(address);
        std::uint32_t pid = 0;
        EXPECT_TRUE(peer.call("GetConnectionUnixProcessID", "org.freedesktop.DBus").read(pid));
        return static_cast<pid_t>(pid);
    }
    void endDaemon() {
        std::string error;
        auto connection = BusConnection::open(address, error);
        if (!connection) return;
        const pid_t pid = daemon();
        ASSERT_GT(pid, 1);
        const UniqueFD process(static_cast<int>(syscall(SYS_pidfd_open, pid, 0)));
        ASSERT_TRUE(process);
        kill(pid, SIGKILL);
        // For the process itself, which is nobody's child here: it closes its descriptors one by
        // one, and may listen for a while after the connections have ended.
        pollfd end = {process.get(), POLLIN, 0};
        EXPECT_EQ(poll(&end, 1, kEndSeconds * 1000), 1);
    }
    static constexpr int kEndSeconds = 60;
    static std::vector<std::string> connect() { return {NOTIFICATION_HELPER, "connect"}; }

    TempDir home;
    EnvVar runtime{"XDG_RUNTIME_DIR", home.makeDirectory("runtime").c_str()};
    EnvVar none{"DBUS_SESSION_BUS_ADDRESS", nullptr};
    const std::string socket = home / "runtime/Orvane/bus";
    const std::string address = BusLauncher::addressOf(socket);
};

std::string identifier(const PipedChild&, std::string line) {
    EXPECT_EQ(line.size(), 32u) << line;
    return line;
}

}  // namespace

TEST(BusLauncher, EscapesWhatAnAddressMeansOtherwise) {
    EXPECT_EQ(BusLauncher::addressOf("/run/user/1/a-b_c.d"), "unix:path=/run/user/1/a-b_c.d");
    EXPECT_EQ(BusLauncher::addressOf("/a b,c;d=%\xc3\xa9"), "unix:path=/a%20b%2cc%3bd%3d%25%c3%a9");
}

TEST_F(BusLauncherTest, OfTwoProgramsAtOnceOneStartsTheBus) {
    PipedChild first(connect());
    PipedChild second(connect());
    const std::string id = identifier(first, first.readLine());
    EXPECT_EQ(identifier(second, second.readLine()), id);
    struct stat status;
    ASSERT_EQ(stat((home / "runtime/Orvane").c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777, 0700u);
}

TEST_F(BusLauncherTest, TheBusOutlivesTheProgramThatStartedIt) {
    PipedChild first(connect());
    const std::string id = identifier(first, first.readLine());
    first.closeInput();
    EXPECT_EQ(first.wait(), 0);
    PipedChild second(connect());
    EXPECT_EQ(identifier(second, second.readLine()), id);
}

TEST_F(BusLauncherTest, ReplacesABusThatHasDied) {
    std::string id;
    {
        PipedChild first(connect());
        id = identifier(first, first.readLine());
    }
    endDaemon();
    ASSERT_EQ(access(socket.c_str(), F_OK), 0) << "the socket of the dead bus must be there still";
    PipedChild second(connect());
    PipedChild third(connect());
    const std::string newID = identifier(second, second.readLine());
    EXPECT_NE(newID, id);
    EXPECT_EQ(identifier(third, third.readLine()), newID);
}

TEST_F(BusLauncherTest, TheBusHoldsNothingOfTheProgram) {
    const std::string marker = home.writeFile("marker", "");
    const int fd = open(marker.c_str(), O_RDONLY);  // and not closed on exec
    std::string error;
    ASSERT_EQ(BusLauncher::startOwn(error), address) << error;
    close(fd);
    const pid_t pid = daemon();
    EXPECT_NE(getsid(pid), getsid(0));
    for (const auto& entry :
         std::filesystem::directory_iterator("/proc/" + std::to_string(pid) + "/fd")) {
        const std::string target = std::filesystem::read_symlink(entry.path());
        EXPECT_NE(target, marker);
        EXPECT_FALSE(target.ends_with("bus.lock")) << target;
        const int number = std::stoi(entry.path().filename());
        if (number > 1) continue;
        EXPECT_EQ(target, "/dev/null");
    }
    EXPECT_EQ(BusLauncher::startOwn(error), address) << error;
    EXPECT_EQ(daemon(), pid);
}

TEST_F(BusLauncherTest, UsesTheBusOfTheRuntimeDirectoryFirst) {
    EXPECT_EQ(BusLauncher::getAddresses(), std::vector<std::string>());
    home.writeFile("runtime/bus", "");
    const std::string inDirectory = "unix:path=" + (home / "runtime/bus");
    EXPECT_EQ(BusLauncher::getAddresses(), std::vector<std::string>({inDirectory}));
    const EnvVar given("DBUS_SESSION_BUS_ADDRESS", "unix:path=/nowhere");
    EXPECT_EQ(BusLauncher::getAddresses(),
              std::vector<std::string>({"unix:path=/nowhere", inDirectory}));
}

TEST_F(BusLauncherTest, PassesOverAnAddressWhereNobodyAnswers) {
    const EnvVar given("DBUS_SESSION_BUS_ADDRESS", "unix:path=/nowhere");
    PipedChild child(connect());
    identifier(child, child.readLine());
    EXPECT_GT(daemon(), 1);
}

TEST_F(BusLauncherTest, SaysWhyThereIsNone) {
    std::string error;
    {
        const EnvVar path("PATH", "/nowhere");
        EXPECT_EQ(BusLauncher::startOwn(error), "");
        EXPECT_EQ(error, "can't start dbus-daemon: No such file or directory");
    }
    const EnvVar deep("XDG_RUNTIME_DIR", home.makeDirectory(std::string(100, 'd')).c_str());
    EXPECT_EQ(BusLauncher::startOwn(error), "");
    EXPECT_TRUE(error.ends_with("is too long for a socket")) << error;
}
