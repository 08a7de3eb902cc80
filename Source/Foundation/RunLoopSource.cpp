#include "Foundation/RunLoopSource.h"

#include "Foundation/RunLoop.h"

#include <poll.h>

#include <utility>

namespace Foundation {

RunLoopSource::~RunLoopSource() {
    removeFromLoop();
}

void RunLoopSource::addTo(RunLoop& loop, const std::string& mode) {
    mLoop = &loop;
    mMode = mode;
    loop.addSource(this);
}

void RunLoopSource::removeFromLoop() {
    if (RunLoop* loop = std::exchange(mLoop, nullptr)) loop->removeSource(this);
}

RunLoopSource::Interest FileDescriptorSource::interest() noexcept {
    Interest wanted;
    if (mReadHandler) wanted.events |= POLLIN;
    if (mWriteHandler) wanted.events |= POLLOUT;
    if (wanted.events) wanted.fd = mFD;
    return wanted;
}

void FileDescriptorSource::ready(short events) {
    constexpr short kFailed = POLLERR | POLLHUP | POLLNVAL;
    // Either handler may replace the handlers or destroy the source, so both are taken first.
    const Handler write =
        (events & (POLLOUT | kFailed)) ? std::exchange(mWriteHandler, nullptr) : Handler();
    const Handler read = (events & (POLLIN | kFailed)) ? mReadHandler : Handler();
    if (read) {
        read();
    }
    if (write) {
        write();
    }
}

}  // namespace Foundation
