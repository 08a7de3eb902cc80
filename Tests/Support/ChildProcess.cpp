#include "Support/ChildProcess.h"

#include "Foundation/UniqueFD.h"
#include "Support/TempDir.h"

#include <fcntl.h>
#include <pty.h>
#include <spawn.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <stdexcept>

namespace Support {

namespace {

using Foundation::UniqueFD;

void check(int error, const char* what) {
    if (error != 0) throw std::runtime_error(std::string(what) + ": " + std::strerror(error));
}

UniqueFD createFile(const std::string& path) {
    UniqueFD fd(open(path.c_str(), O_CREAT | O_WRONLY | O_TRUNC | O_CLOEXEC, 0600));
    if (!fd) check(errno, path.c_str());
    return fd;
}

/// What is left in a terminal whose other end is closed.
std::string readTerminal(int fd) {
    std::string text;
    char buffer[4096];
    for (ssize_t n = 0; (n = read(fd, buffer, sizeof buffer)) > 0;) {
        text.append(buffer, static_cast<std::size_t>(n));
    }
    return text;
}

pid_t spawn(const std::vector<std::string>& command, int out, int err) {
    std::vector<char*> arguments;
    arguments.reserve(command.size() + 1);
    for (const std::string& word : command) {
        arguments.push_back(const_cast<char*>(word.c_str()));
    }
    arguments.push_back(nullptr);
    posix_spawn_file_actions_t actions;
    check(posix_spawn_file_actions_init(&actions), "posix_spawn_file_actions_init");
    posix_spawn_file_actions_adddup2(&actions, out, STDOUT_FILENO);
    posix_spawn_file_actions_adddup2(&actions, err, STDERR_FILENO);
    pid_t pid = 0;
    const int error = posix_spawn(&pid, arguments[0], &actions, nullptr, arguments.data(), environ);
    posix_spawn_file_actions_destroy(&actions);
    check(error, arguments[0]);
    return pid;
}

double secondsOf(const timeval& time) {
    return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_usec) * 1e-6;
}

void waitFor(ChildResult& child) {
    int status = 0;
    rusage usage = {};
    while (wait4(child.pid, &status, 0, &usage) < 0) {
        if (errno != EINTR) check(errno, "wait4");
    }
    child.status = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    child.processorSeconds = secondsOf(usage.ru_utime) + secondsOf(usage.ru_stime);
    child.peakBytes = static_cast<std::size_t>(usage.ru_maxrss) * 1024;
}

}  // namespace

ChildResult runChild(const std::vector<std::string>& command, ChildStderr kind) {
    const TempDir dir;
    const UniqueFD out = createFile(dir / "out");
    UniqueFD err = createFile(dir / "err");
    UniqueFD terminal;
    if (kind == ChildStderr::Terminal) {
        int master = -1;
        int slave = -1;
        if (openpty(&master, &slave, nullptr, nullptr, nullptr) != 0) check(errno, "openpty");
        terminal = UniqueFD(master);
        err = UniqueFD(slave);
        fcntl(master, F_SETFD, FD_CLOEXEC);
        fcntl(slave, F_SETFD, FD_CLOEXEC);
    }
    ChildResult result;
    result.pid = spawn(command, out.get(), err.get());
    err.close();
    waitFor(result);
    result.out = dir.readFile("out");
    result.err = terminal ? readTerminal(terminal.get()) : dir.readFile("err");
    return result;
}

}  // namespace Support
