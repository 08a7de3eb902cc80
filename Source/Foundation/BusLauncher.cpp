#include "Foundation/BusLauncher.h"

#include "Foundation/ProcessBeginning.h"
#include "Foundation/RuntimeDirectory.h"
#include "Foundation/UniqueFD.h"

#include <fcntl.h>
#include <glib.h>
#include <poll.h>
#include <sys/file.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <utility>

extern char** environ;

namespace Foundation {

namespace {

/// Waits for the lock of `path`, which its end gives up. Whoever holds it is done within
/// `BusLauncher::kStartSeconds`. -1 if the file cannot be had.
int lockFile(const std::string& path, std::string& error) {
    const int fd = open(path.c_str(), O_RDWR | O_CREAT | O_CLOEXEC | O_NOFOLLOW, 0600);
    int result = fd;
    if (fd >= 0) {
        do {
            result = flock(fd, LOCK_EX);
        } while (result < 0 && errno == EINTR);
    }
    if (result >= 0) return fd;
    error = "can't lock " + path + ": " + std::strerror(errno);
    if (fd >= 0) close(fd);
    return -1;
}

enum class Answer { Yes, No, PathTooLong };

/// Whether somebody listens on the socket at `path`.
Answer askWhoListens(const std::string& path) {
    sockaddr_un address = {};
    address.sun_family = AF_UNIX;
    if (path.size() >= sizeof address.sun_path) return Answer::PathTooLong;
    path.copy(address.sun_path, path.size());
    const UniqueFD fd(socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
    const int result =
        connect(fd.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address);
    // A full queue of waiting connections means that somebody listens.
    return result == 0 || errno == EAGAIN ? Answer::Yes : Answer::No;
}

/// Waits until something can be read. False after the time-out or at the end of the stream.
bool awaitWord(int fd) {
    pollfd wanted = {fd, POLLIN, 0};
    int result;
    do {
        result = poll(&wanted, 1, BusLauncher::kStartSeconds * 1000);
    } while (result < 0 && errno == EINTR);
    char word;
    return result == 1 && read(fd, &word, 1) == 1;
}

void reap(pid_t pid) {
    while (waitpid(pid, nullptr, 0) < 0 && errno == EINTR) {
    }
}

/// Starts a daemon and waits until it listens.
bool startDaemon(const std::string& address, std::string& error) {
    int fds[2];
    if (pipe2(fds, O_CLOEXEC) != 0) {
        error = std::string("can't make a pipe: ") + std::strerror(errno);
        return false;
    }
    const UniqueFD word(fds[0]);
    UniqueFD ready(fds[1]);
    const ProcessBeginning beginning(ready.get());
    const std::string listen = "--address=" + address;
    static_assert(ProcessBeginning::kGiven == 3, "as --print-address has it");
    // It forks once it listens, so that it is nobody's child and leaves no zombie behind.
    const char* arguments[] = {"dbus-daemon",       "--session",  "--fork",
                               "--nopidfile",       "--nosyslog", listen.c_str(),
                               "--print-address=3", nullptr};
    pid_t pid;
    const int result = posix_spawnp(&pid, arguments[0], &beginning.actions, &beginning.attributes,
                                    const_cast<char**>(arguments), environ);
    ready.close();
    if (result != 0) {
        error = std::string("can't start dbus-daemon: ") + std::strerror(result);
        return false;
    }
    const bool listens = awaitWord(word.get());
    if (!listens) kill(pid, SIGKILL);
    reap(pid);
    if (!listens) error = "dbus-daemon did not begin to listen at " + address;
    return listens;
}

}  // namespace

std::string BusLauncher::addressOf(const std::string& socketPath) {
    constexpr char kHex[] = "0123456789abcdef";
    std::string address = "unix:path=";
    for (const char c : socketPath) {
        if (g_ascii_isalnum(c) || std::strchr("-_/.", c)) {
            address += c;
        } else {
            address += {'%', kHex[(c >> 4) & 15], kHex[c & 15]};
        }
    }
    return address;
}

std::vector<std::string> BusLauncher::getAddresses() {
    std::vector<std::string> addresses;
    const char* given = std::getenv("DBUS_SESSION_BUS_ADDRESS");
    if (given && *given) addresses.emplace_back(given);
    const char* directory = std::getenv("XDG_RUNTIME_DIR");
    if (directory && directory[0] == '/' && RuntimeDirectory::isTrusted(directory)) {
        const std::string socket = std::string(directory) + "/bus";
        if (access(socket.c_str(), F_OK) == 0) addresses.push_back(addressOf(socket));
    }
    return addresses;
}

std::string BusLauncher::getSystemAddress() {
    const char* given = std::getenv("DBUS_SYSTEM_BUS_ADDRESS");
    return given && *given ? given : "unix:path=/run/dbus/system_bus_socket";
}

std::string BusLauncher::startOwn(std::string& error) {
    const std::string directory = RuntimeDirectory::getPath(error);
    if (directory.empty()) return {};
    const UniqueFD lock(lockFile(directory + "/bus.lock", error));
    if (lock.get() < 0) return {};
    const std::string socket = directory + "/bus";
    const std::string address = addressOf(socket);
    switch (askWhoListens(socket)) {
        case Answer::Yes:
            return address;
        case Answer::PathTooLong:
            error = socket + " is too long for a socket";
            return {};
        case Answer::No:
            break;
    }
    // What a daemon left that has died would be in the way of the next one.
    unlink(socket.c_str());
    return startDaemon(address, error) ? address : std::string();
}

}  // namespace Foundation
