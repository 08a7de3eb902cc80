#pragma once

#include "Foundation/RunLoop.h"
#include "Foundation/UniqueFD.h"

#include <deque>
#include <functional>
#include <mutex>

namespace Foundation {

/// Brings calls from any thread into the turns of a loop.
class RunLoop::PerformSource : public RunLoopSource {
 public:
    PerformSource();
    ~PerformSource() override;

    void wakeUp();
    void perform(std::function<void()> function);

 private:
    Interest interest() noexcept override;
    void ready(short events) override;
    bool isReentrant() const noexcept override { return true; }

    std::size_t countQueued();
    std::function<void()> takeFirst();

    UniqueFD mEventFD;
    std::mutex mMutex;
    std::deque<std::function<void()>> mQueue;  ///< guarded by mMutex
};

}  // namespace Foundation
