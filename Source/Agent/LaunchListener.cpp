#include "Agent/LaunchListener.h"

#include "Agent/ServerSocket.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/Number.h"
#include "Foundation/RunLoop.h"

#include <fcntl.h>
#include <sys/socket.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <csignal>
#include <cstring>

namespace Orvane {

using namespace Foundation;

namespace {

/// Of an address, which nobody looks at.
constexpr std::size_t kAddressBytes = 128;
/// What the loop calls for: there is something to read.
constexpr int kReadCallback = 1;

/// Whoever is gone again when accepted must not keep the loop waiting for the next.
void makeNonBlocking(int listener) {
    const int flags = fcntl(listener, F_GETFL);
    if (flags >= 0) fcntl(listener, F_SETFL, flags | O_NONBLOCK);
}

EventQueue makeQueue() {
    gLogIPC.log("LaunchListener: initializing");
    return {};
}

}  // namespace

LaunchListener* LaunchListener::instance() {
    static LaunchListener sInstance(ServiceManager::current());
    return &sInstance;
}

LaunchListener::LaunchListener(ServiceManager& manager)
    : mEventQueue(makeQueue()), mEventSource(mEventQueue.getDescriptor()) {
    mEventSource.setReadHandler([this] { fileDescriptorCallback(); });
    mEventSource.addTo(RunLoop::current(), RunLoop::kDefaultMode);
    checkIn(manager);
}

LaunchListener::~LaunchListener() = default;

void LaunchListener::checkIn(ServiceManager& manager) {
    gLogIPC.log("LaunchListener: Checking in with svcd");
    if (!manager.isManaged()) {
        gLogIPC.log("    ... not launched by svcd (SVC_KEY_IS_MANAGED == 0)");
        return;
    }
    takeReply(manager.checkIn());
}

void LaunchListener::takeReply(const ServiceManager::Reply& reply) {
    switch (reply.type) {
        case ServiceManager::Reply::kNone:
            gWarn.log("Couldn't check in with svcd: no reply");
            break;
        case ServiceManager::Reply::kDictionary:
            if (reply.dictionary->isEmpty()) {
                gLogIPC.log("    ... failed: mConfigDict is empty");
            } else {
                mConfigDict = reply.dictionary;
                gLogIPC.log("    ... checked in with svcd!");
            }
            break;
        case ServiceManager::Reply::kError:
            if (reply.error == EACCES) {
                gLogIPC.log("    ... not launched by svcd (EACCES)");
            } else {
                gWarn.log("Couldn't check in with svcd: errno=%i/%s", reply.error,
                          std::strerror(reply.error));
            }
            break;
        default:
            gLogIPC.log("    ... failed: mConfigDict is unexpected type %i",
                        static_cast<int>(reply.type));
    }
}

bool LaunchListener::registerSignal(int signal) {
    return registerEvent(static_cast<std::uintptr_t>(signal), EventQueue::kSignal,
                         EventQueue::kAdd | EventQueue::kEnable, 0, 0, nullptr);
}

bool LaunchListener::registerEvent(std::uintptr_t ident, std::int16_t filter, std::uint16_t flags,
                                   std::uint32_t fflags, std::intptr_t data, void* userData) {
    if (mEventQueue.add({ident, filter, flags, fflags, data, userData})) return true;
    const int error = errno;
    gWarn.log("LaunchListener: could not register kevent %hd.  Error is %d/%s", filter, error,
              std::strerror(error));
    return false;
}

bool LaunchListener::hasSockets() const {
    return mConfigDict && mConfigDict->get(ServiceManager::kSockets);
}

const Array* LaunchListener::getSocketListeners(const char* name) const {
    if (!mConfigDict) {
        gWarn.log("LaunchListener: getSocketListeners failed - no svcd configDict");
        return nullptr;
    }
    const auto* sockets = mConfigDict->getAs<Dictionary>(ServiceManager::kSockets);
    if (!sockets) {
        gWarn.log("LaunchListener: getSocketListeners failed - No socket dict");
        return nullptr;
    }
    const auto* listeners = sockets->getAs<Array>(name);
    if (!listeners || listeners->isEmpty()) {
        gWarn.log("LaunchListener: Sockets dict has no entry for key '%s'", name);
        return nullptr;
    }
    return listeners;
}

int LaunchListener::getServerSocket(const char* name) const {
    const Array* listeners = getSocketListeners(name);
    const Number* first = listeners ? listeners->getAs<Number>(0) : nullptr;
    return first ? static_cast<int>(first->getInteger()) : -1;
}

bool LaunchListener::registerServerSocket(ServerSocket* socket, const char* name) {
    const Array* listeners = getSocketListeners(name);
    if (!listeners) return false;
    bool areAll = true;
    for (std::size_t i = 0; i < listeners->count(); ++i) {
        const auto descriptor = Number::getInteger(listeners->getAs<Number>(i));
        makeNonBlocking(static_cast<int>(descriptor));
        if (registerEvent(static_cast<std::uintptr_t>(descriptor), EventQueue::kRead,
                          EventQueue::kAdd | EventQueue::kEnable, 0, 0, socket)) {
            gLogIPC.log("LaunchListener listening on fd %i for ServerSocket %p '%s'",
                        static_cast<int>(descriptor), static_cast<const void*>(socket), name);
        } else {
            areAll = false;
        }
    }
    return areAll;
}

int LaunchListener::getMachServerPort(const char* name) const {
    if (!mConfigDict) return 0;
    const auto* services = mConfigDict->getAs<Dictionary>(ServiceManager::kServices);
    if (!services) {
        gWarn.log("No MachServices key found in svcd config!");
        return 0;
    }
    const auto* port = services->getAs<Number>(name);
    if (!port) {
        gWarn.log("No '%s' key found in MachServices dictionary in svcd config!", name);
        return 0;
    }
    return static_cast<int>(port->getInteger());
}

void LaunchListener::fileDescriptorCallback() {
    callGuarded("void Orvane::LaunchListener::fileDescriptorCallback()", [this] { serveEvent(); });
}

void LaunchListener::serveEvent() {
    gLogIPC.log("LaunchListener::fileDescriptorCallback -- type=%i, kqueue=%i", kReadCallback,
                mEventQueue.getDescriptor());
    EventQueue::Event event;
    const int count = mEventQueue.fetch(event);
    if (count < 0) {
        const int error = errno;
        gWarn.log("LaunchListener: could not pick up event.  Error is %d/%s", error,
                  std::strerror(error));
        pauseAll();
    } else if (count == 0) {
        gLogIPC.log("LaunchListener: no event in kqueue!");
    } else {
        serve(event);
    }
}

void LaunchListener::serve(const EventQueue::Event& event) {
    switch (event.filter) {
        case EventQueue::kSignal:
            signalCame(event);
            break;
        case EventQueue::kRead:
            acceptConnection(event);
            break;
        default:
            gWarn.log("LaunchListener: Unknown event; filter=%i", static_cast<int>(event.filter));
            pause(event);
    }
}

void LaunchListener::pause(const EventQueue::Event& event) {
    mEventQueue.pause(event);
    if (!mPauseTimer.isRunning()) mPauseTimer.start(kPauseSeconds, false);
}

void LaunchListener::pauseAll() {
    mEventSource.removeFromLoop();
    if (!mPauseTimer.isRunning()) mPauseTimer.start(kPauseSeconds, false);
}

void LaunchListener::resume() {
    mEventQueue.resume();
    if (!mEventSource.getLoop()) mEventSource.addTo(RunLoop::current(), RunLoop::kDefaultMode);
}

void LaunchListener::signalCame(const EventQueue::Event& event) {
    const int signal = static_cast<int>(event.ident);
    gLog.log("***** LaunchListener got signal: %d (%s) x%d", signal, strsignal(signal),
             static_cast<int>(event.data));
    RunLoop::current().stop();
}

void LaunchListener::acceptConnection(const EventQueue::Event& event) {
    const int listener = static_cast<int>(event.ident);
    std::array<char, kAddressBytes> address;
    socklen_t length = kAddressBytes;
    UniqueFD connection(
        accept4(listener, reinterpret_cast<sockaddr*>(address.data()), &length, SOCK_CLOEXEC));
    if (!connection) {
        gWarn.log("LaunchListener: accept(%i) failed, errno=%i", listener, errno);
        pause(event);
        return;
    }
    auto* serverSocket = static_cast<ServerSocket*>(event.userData);
    gLogIPC.log("LaunchListener got socket event on fd %i: socket=%i, ServerSocket=%p", listener,
                connection.get(), static_cast<const void*>(serverSocket));
    OV_ASSERT(serverSocket);
    serverSocket->accept(connection.detach());
    gLogIPC.log("LaunchListener finished socket event");
}

}  // namespace Orvane
