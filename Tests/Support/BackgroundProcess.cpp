#include "Support/BackgroundProcess.h"

#include "Foundation/UniqueFD.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/prctl.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <stdexcept>

namespace Support {

namespace {

/// Between fork and exec: nothing here may take memory.
[[noreturn]] void become(char* const* arguments, pid_t parent) {
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    if (getppid() != parent) _exit(EXIT_FAILURE);
    const int nothing = open("/dev/null", O_RDONLY);
    dup2(nothing, STDIN_FILENO);
    execvp(arguments[0], arguments);
    _exit(127);
}

}  // namespace

BackgroundProcess::BackgroundProcess(const std::vector<std::string>& command) {
    std::vector<char*> arguments;
    arguments.reserve(command.size() + 1);
    for (const std::string& argument : command) {
        arguments.push_back(const_cast<char*>(argument.c_str()));
    }
    arguments.push_back(nullptr);
    const pid_t parent = getpid();
    mPID = fork();
    if (mPID == 0) become(arguments.data(), parent);
    if (mPID < 0) throw std::runtime_error("cannot start " + command.front());
}

BackgroundProcess::~BackgroundProcess() {
    kill(mPID, SIGTERM);
    if (!endsInTime()) kill(mPID, SIGKILL);
    while (waitpid(mPID, nullptr, 0) < 0 && errno == EINTR) {
    }
}

/// Also where it has ended and was waited for.
bool BackgroundProcess::endsInTime() const {
    constexpr int kMilliseconds = 60'000;
    const Foundation::UniqueFD process(static_cast<int>(syscall(SYS_pidfd_open, mPID, 0)));
    pollfd wanted = {.fd = process.get(), .events = POLLIN, .revents = 0};
    return !process || poll(&wanted, 1, kMilliseconds) != 0;
}

}  // namespace Support
