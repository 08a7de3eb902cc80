#include "Support/PrivateJournal.h"

#include "Support/EnterNamespace.h"

#include <endian.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/socket.h>
#include <sys/un.h>

#include <cerrno>
#include <cstdint>
#include <cstring>
#include <filesystem>
#include <stdexcept>

namespace Support {

namespace {

bool mountOwnRun() {
    return mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0 &&
           mount("tmpfs", "/run", "tmpfs", 0, "mode=0755") == 0;
}

Foundation::UniqueFD listenAt(const std::string& path) {
    std::filesystem::create_directories(std::filesystem::path(path).parent_path());
    Foundation::UniqueFD fd(socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0));
    sockaddr_un address = {};
    address.sun_family = AF_UNIX;
    path.copy(address.sun_path, sizeof address.sun_path - 1);
    if (!fd || bind(fd.get(), reinterpret_cast<sockaddr*>(&address), sizeof address) != 0) {
        throw std::runtime_error("cannot listen at " + path);
    }
    return fd;
}

/// Reads one message of the journal's native protocol: fields as "KEY=value\n" or, for any bytes,
/// as "KEY\n", the value's length in 64 bits, little-endian, the value and "\n".
std::map<std::string, std::string> parse(std::string_view message) {
    std::map<std::string, std::string> fields;
    while (!message.empty()) {
        const std::size_t keyEnd = message.find_first_of("=\n");
        if (keyEnd == std::string_view::npos) throw std::runtime_error("bad journal message");
        const std::string key(message.substr(0, keyEnd));
        const bool isText = message[keyEnd] == '=';
        message.remove_prefix(keyEnd + 1);
        std::size_t length = message.find('\n');
        if (!isText) {
            std::uint64_t size = 0;
            message.copy(reinterpret_cast<char*>(&size), sizeof size);
            message.remove_prefix(sizeof size);
            length = le64toh(size);
        }
        fields[key] = std::string(message.substr(0, length));
        message.remove_prefix(length + 1);
    }
    return fields;
}

}  // namespace

PrivateJournal::PrivateJournal() {
    if (enterNamespace(CLONE_NEWNS) != EnteredNamespace::kNot && mountOwnRun()) {
        mSocket = listenAt("/run/systemd/journal/socket");
    } else {
        mProblem = std::string("no mount namespace: ") + std::strerror(errno);
    }
}

std::vector<std::map<std::string, std::string>> PrivateJournal::takeMessages() {
    std::vector<std::map<std::string, std::string>> messages;
    char buffer[65536];
    for (ssize_t n = 0; (n = recv(mSocket.get(), buffer, sizeof buffer, MSG_DONTWAIT)) >= 0;) {
        messages.push_back(parse({buffer, static_cast<std::size_t>(n)}));
    }
    return messages;
}

}  // namespace Support
