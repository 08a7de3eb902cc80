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
    // Either handler may replace the handlers, remove the source or destroy it, and what is called
    // is a copy of its own.
    const std::weak_ptr<int> life = mLife;
    if (const Handler read = (events & (POLLIN | kFailed)) ? mReadHandler : nullptr) read();
    if (life.expired() || !getLoop() || !(events & (POLLOUT | kFailed))) return;
    if (const Handler write = std::exchange(mWriteHandler, nullptr)) write();
}

}  // namespace Foundation
