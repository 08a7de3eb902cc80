#pragma once

#include "Foundation/RunLoop.h"

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

    int mEventFD;
    std::mutex mMutex;
    std::deque<std::function<void()>> mQueue;  ///< guarded by mMutex
};

}  // namespace Foundation
