#include "Support/PrivateBus.h"

#include "Foundation/Bus.h"

#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <stdexcept>

extern char** environ;

namespace Support {

namespace {

/// What a session's bus is, but for its limits. It listens at the address that it is given.
constexpr const char* kBegin =
    "<busconfig><type>session</type><listen>unix:tmpdir=/tmp</listen>"
    "<auth>EXTERNAL</auth><standard_session_servicedirs/>"
    "<policy context=\"default\"><allow send_destination=\"*\" eavesdrop=\"true\"/>"
    "<allow eavesdrop=\"true\"/><allow own=\"*\"/></policy>";
constexpr const char* kEnd = "</busconfig>\n";

}  // namespace

PrivateBus::PrivateBus() : mAddress("unix:path=" + (mDirectory / "bus")) {
    start();
    mVariable.emplace("DBUS_SESSION_BUS_ADDRESS", mAddress.c_str());
    Foundation::Bus::user().close();
}

PrivateBus::~PrivateBus() {
    Foundation::Bus::user().close();
    if (mPID > 0) die();
}

void PrivateBus::start(const std::string& limits) {
    int fds[2];
    if (pipe2(fds, O_CLOEXEC) != 0) throw std::runtime_error("pipe2");
    unlink((mDirectory / "bus").c_str());
    mDirectory.writeFile("bus.conf", std::string(kBegin) + limits + kEnd);
    const std::string configuration = "--config-file=" + (mDirectory / "bus.conf");
    const std::string listen = "--address=" + mAddress;
    const char* arguments[] = {"dbus-daemon",  limits.empty() ? "--session" : configuration.c_str(),
                               "--nofork",     "--nosyslog",
                               listen.c_str(), "--print-address=3",
                               nullptr};
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_adddup2(&actions, fds[1], 3);
    // It warns about limits that it may not raise.
    posix_spawn_file_actions_addopen(&actions, 2, "/dev/null", O_WRONLY, 0);
    posix_spawn_file_actions_addclosefrom_np(&actions, 4);
    const int result = posix_spawnp(&mPID, arguments[0], &actions, nullptr,
                                    const_cast<char**>(arguments), environ);
    posix_spawn_file_actions_destroy(&actions);
    close(fds[1]);
    char word;
    const bool isReady = result == 0 && read(fds[0], &word, 1) == 1;
    close(fds[0]);
    if (!isReady) throw std::runtime_error("dbus-daemon does not start");
}

void PrivateBus::pause() {
    kill(mPID, SIGSTOP);
    // Until it stands still.
    waitpid(mPID, nullptr, WUNTRACED);
}

void PrivateBus::resume() {
    kill(mPID, SIGCONT);
}

void PrivateBus::die() {
    kill(mPID, SIGKILL);
    waitpid(mPID, nullptr, 0);
    mPID = -1;
}

}  // namespace Support
