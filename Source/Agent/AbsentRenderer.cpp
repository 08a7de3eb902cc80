#include "Agent/AbsentRenderer.h"

#include "Agent/LaunchListener.h"
#include "Foundation/Logger.h"
#include "Foundation/Number.h"
#include "Foundation/UniqueFD.h"

#include <poll.h>
#include <sys/socket.h>

namespace Orvane {

using Foundation::Array;
using Foundation::Number;
using Foundation::UniqueFD;

namespace {

bool hasWaiting(int listener) {
    pollfd wanted = {.fd = listener, .events = POLLIN, .revents = 0};
    return poll(&wanted, 1, 0) == 1 && (wanted.revents & POLLIN);
}

void turnAwayWaitingAt(int listener) {
    for (int i = 0; i < AbsentRenderer::kMostWaiting && hasWaiting(listener); ++i) {
        const UniqueFD connection(accept4(listener, nullptr, nullptr, SOCK_CLOEXEC));
        if (!connection) break;
    }
}

}  // namespace

void AbsentRenderer::startServer(LaunchListener& listener) {
    if (listener.hasSockets()) listener.registerServerSocket(this, kSocketName);
}

void AbsentRenderer::turnAwayWaiting(const LaunchListener& listener) {
    const Array* sockets =
        listener.hasSockets() ? listener.getSocketListeners(kSocketName) : nullptr;
    for (std::size_t i = 0; sockets && i < sockets->count(); ++i) {
        turnAwayWaitingAt(static_cast<int>(Number::getInteger(sockets->getAs<Number>(i))));
    }
}

void AbsentRenderer::accept(int connection) {
    const UniqueFD ended(connection);
    gLogIPC.log("There are no pages: connection %i is ended", connection);
}

}  // namespace Orvane
