#include "Foundation/RunLoopPerformSource.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Guard.h"

#include <poll.h>
#include <sys/eventfd.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <utility>

namespace Foundation {

RunLoop::PerformSource::PerformSource() : mEventFD(eventfd(0, EFD_NONBLOCK | EFD_CLOEXEC)) {
    OV_ASSERT_MESSAGE(mEventFD, "A run loop cannot be woken: %s", std::strerror(errno));
}

RunLoop::PerformSource::~PerformSource() {
    removeFromLoop();
}

void RunLoop::PerformSource::wakeUp() {
    // Fails only when the counter is full, and then a wake-up is pending already.
    const std::uint64_t one = 1;
    [[maybe_unused]] const ssize_t ignored = write(mEventFD.get(), &one, sizeof one);
}

void RunLoop::PerformSource::perform(std::function<void()> function) {
    {
        const std::lock_guard lock(mMutex);
        mQueue.push_back(std::move(function));
    }
    wakeUp();
}

RunLoopSource::Interest RunLoop::PerformSource::interest() noexcept {
    // A run inside one of the functions finds the event taken, and the functions behind it waiting.
    return {.fd = mEventFD.get(), .events = POLLIN, .readyNow = countQueued() > 0};
}

void RunLoop::PerformSource::ready(short) {
    std::uint64_t count;
    [[maybe_unused]] const ssize_t ignored = read(mEventFD.get(), &count, sizeof count);
    // Those that are added from here on wait for the next turn.
    for (std::size_t left = countQueued(); left > 0; --left) {
        const std::function<void()> function = takeFirst();
        if (!function) break;
        callGuarded("void Foundation::RunLoop::perform(function)", function);
    }
}

std::size_t RunLoop::PerformSource::countQueued() {
    const std::lock_guard lock(mMutex);
    return mQueue.size();
}

/// Null if there is none: a run inside another function may have served it.
std::function<void()> RunLoop::PerformSource::takeFirst() {
    const std::lock_guard lock(mMutex);
    if (mQueue.empty()) return nullptr;
    std::function<void()> first = std::move(mQueue.front());
    mQueue.pop_front();
    return first;
}

}  // namespace Foundation
