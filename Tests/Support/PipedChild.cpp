#include "Support/PipedChild.h"

#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <stdexcept>

namespace Support {

namespace {

using Foundation::UniqueFD;

struct Pipe {
    Pipe() {
        int fds[2];
        if (pipe2(fds, O_CLOEXEC) != 0) throw std::runtime_error("pipe2");
        readEnd = UniqueFD(fds[0]);
        writeEnd = UniqueFD(fds[1]);
    }
    UniqueFD readEnd;
    UniqueFD writeEnd;
};

}  // namespace

PipedChild::PipedChild(const std::vector<std::string>& command) {
    Pipe in;
    Pipe out;
    std::vector<char*> arguments;
    for (const std::string& word : command) {
        arguments.push_back(const_cast<char*>(word.c_str()));
    }
    arguments.push_back(nullptr);
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_adddup2(&actions, in.readEnd.get(), STDIN_FILENO);
    posix_spawn_file_actions_adddup2(&actions, out.writeEnd.get(), STDOUT_FILENO);
    const int error =
        posix_spawn(&mPID, arguments[0], &actions, nullptr, arguments.data(), environ);
    posix_spawn_file_actions_destroy(&actions);
    if (error != 0) throw std::runtime_error("cannot start " + command[0]);
    mInput = std::move(in.writeEnd);
    mOutput = std::move(out.readEnd);
}

PipedChild::~PipedChild() {
    if (mPID <= 0) return;
    kill();
    wait();
}

std::string PipedChild::readLine() {
    constexpr int kMilliseconds = 120'000;
    std::string line;
    pollfd wanted = {.fd = mOutput.get(), .events = POLLIN, .revents = 0};
    for (char c; poll(&wanted, 1, kMilliseconds) == 1 && read(mOutput.get(), &c, 1) == 1;) {
        if (c == '\n') return line;
        line += c;
    }
    return line;
}

void PipedChild::writeLine(const std::string& line) {
    const std::string bytes = line + "\n";
    std::size_t written = 0;
    while (written < bytes.size()) {
        const ssize_t size = write(mInput.get(), bytes.data() + written, bytes.size() - written);
        // What it has not got it does not answer.
        if (size <= 0) return;
        written += static_cast<std::size_t>(size);
    }
}

void PipedChild::closeInput() {
    mInput.close();
}

void PipedChild::kill() {
    ::kill(mPID, SIGKILL);
}

int PipedChild::wait() {
    int status = 0;
    while (waitpid(mPID, &status, 0) < 0) {
    }
    mPID = -1;
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

}  // namespace Support
