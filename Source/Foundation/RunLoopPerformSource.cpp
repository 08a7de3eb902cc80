#include "Foundation/RunLoopPerformSource.h"

#include "Foundation/Guard.h"

#include <poll.h>
#include <sys/eventfd.h>
#include <unistd.h>

#include <utility>

namespace Foundation {

RunLoop::PerformSource::PerformSource() : mEventFD(eventfd(0, EFD_NONBLOCK | EFD_CLOEXEC)) {}

RunLoop::PerformSource::~PerformSource() {
    removeFromLoop();
    if (mEventFD >= 0) close(mEventFD);
}

void RunLoop::PerformSource::wakeUp() {
    // Fails only when the counter is full, and then a wake-up is pending already.
    const std::uint64_t one = 1;
    [[maybe_unused]] const ssize_t ignored = write(mEventFD, &one, sizeof one);
}

void RunLoop::PerformSource::perform(std::function<void()> function) {
    {
        const std::lock_guard lock(mMutex);
        mQueue.push_back(std::move(function));
    }
    wakeUp();
}

RunLoopSource::Interest RunLoop::PerformSource::interest() noexcept {
    return {.fd = mEventFD, .events = POLLIN};
}

void RunLoop::PerformSource::ready(short) {
    std::uint64_t count;
    [[maybe_unused]] const ssize_t ignored = read(mEventFD, &count, sizeof count);
    std::deque<std::function<void()>> due;
    {
        const std::lock_guard lock(mMutex);
        due.swap(mQueue);
    }
    for (const std::function<void()>& function : due) {
        callGuarded("void Foundation::RunLoop::perform(function)", function);
    }
}

}  // namespace Foundation
