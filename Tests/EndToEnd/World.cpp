#include "EndToEnd/World.h"

#include <fcntl.h>
#include <sys/mman.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <cstdlib>
#include <cstring>
#include <stdexcept>
#include <thread>

using Foundation::UniqueFD;

namespace {

constexpr std::size_t kLongestMessage = 4096;

std::string folderOfEnvironment() {
    const char* folder = std::getenv(World::kVariable);
    if (!folder) throw std::runtime_error("there is no world");
    return folder;
}

[[noreturn]] void fail(const char* what) {
    throw std::runtime_error(std::string(what) + ": " + std::strerror(errno));
}

sockaddr_un addressIn(const std::string& folder) {
    sockaddr_un address = {};
    address.sun_family = AF_UNIX;
    const std::string path = folder + "/life";
    if (path.size() >= sizeof address.sun_path) throw std::runtime_error("too long: " + path);
    std::strcpy(address.sun_path, path.c_str());
    return address;
}

}  // namespace

World::World(const std::string& folder, double now) : mFolder(folder) {
    map(O_CREAT | O_TRUNC);
    moveTo(now);
}

World::World() : mFolder(folderOfEnvironment()) {
    map(0);
}

World::~World() {
    munmap(mNow, sizeof *mNow);
}

void World::map(int flags) {
    static_assert(std::atomic<double>::is_always_lock_free);
    const UniqueFD file(open((mFolder + "/now").c_str(), O_RDWR | O_CLOEXEC | flags, 0600));
    if (!file || ftruncate(file.get(), sizeof *mNow) != 0) fail("the world's time");
    void* const memory =
        mmap(nullptr, sizeof *mNow, PROT_READ | PROT_WRITE, MAP_SHARED, file.get(), 0);
    if (memory == MAP_FAILED) fail("mmap");
    mNow = static_cast<std::atomic<double>*>(memory);
}

UniqueFD World::listen() const {
    UniqueFD listener(socket(AF_UNIX, SOCK_SEQPACKET | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
    const sockaddr_un address = addressIn(mFolder);
    const auto* const generic = reinterpret_cast<const sockaddr*>(&address);
    if (bind(listener.get(), generic, sizeof address) != 0) fail("bind");
    if (::listen(listener.get(), 8) != 0) fail("listen");
    return listener;
}

UniqueFD World::connect() const {
    UniqueFD fd(socket(AF_UNIX, SOCK_SEQPACKET | SOCK_CLOEXEC, 0));
    const sockaddr_un address = addressIn(mFolder);
    const auto* const generic = reinterpret_cast<const sockaddr*>(&address);
    if (::connect(fd.get(), generic, sizeof address) != 0) fail("connect");
    return fd;
}

std::string World::receive(int fd) {
    char text[kLongestMessage];
    ssize_t length;
    do {
        length = recv(fd, text, sizeof text, 0);
    } while (length < 0 && errno == EINTR);
    return length > 0 ? std::string(text, static_cast<std::size_t>(length)) : std::string();
}

void World::send(int fd, const std::string& message) {
    // Who does not listen any more is noticed by the silence.
    [[maybe_unused]] const ssize_t ignored =
        ::send(fd, message.data(), message.size(), MSG_NOSIGNAL);
}

void WorldClock::sleep(double) {
    std::this_thread::sleep_for(std::chrono::milliseconds(1));
}
