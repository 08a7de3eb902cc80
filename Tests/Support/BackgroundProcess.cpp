#include "Support/BackgroundProcess.h"

#include <fcntl.h>
#include <sys/prctl.h>
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
    while (waitpid(mPID, nullptr, 0) < 0 && errno == EINTR) {
    }
}

}  // namespace Support
