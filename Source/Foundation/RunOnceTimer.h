#pragma once

#include "Foundation/RefCounted.h"
#include "Foundation/Timer.h"

#include <memory>
#include <type_traits>

namespace Foundation {

/// A timer on the heap that holds a reference to its target, and deletes itself once it has fired.
template <class T>
class RunOnceTimer : public Timer<T> {
 public:
    RunOnceTimer(T* target, typename Timer<T>::Method method) : Timer<T>(target, method, true) {
        static_assert(std::is_base_of_v<RefCounted, T>);
        target->retain();
    }
    ~RunOnceTimer() override { this->getTarget()->release(); }
};

/// Calls `method` of `target` once, `delay` seconds from now, and keeps the target alive until
/// then. 0 calls it in the loop's next turn. Cannot be cancelled.
template <class T>
void callAfterDelay(double delay, T* target, void (T::*method)()) {
    auto timer = std::make_unique<RunOnceTimer<T>>(target, method);
    timer->start(delay, false);
    static_cast<void>(timer.release());  // it owns itself from here on
}

}  // namespace Foundation
