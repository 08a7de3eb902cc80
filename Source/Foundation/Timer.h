#pragma once

#include "Foundation/AbstractTimer.h"

namespace Foundation {

/// A timer that calls a method of an object, which it does not own: mostly it is a member of it.
template <class T>
class Timer : public AbstractTimer {
 public:
    using Method = void (T::*)();

    /// REQUIRES: `target` outlives the timer, or the timer is stopped before.
    Timer(T* target, Method method) : Timer(target, method, false) {}

    void fire() override { (mTarget->*mMethod)(); }

 protected:
    Timer(T* target, Method method, bool deleteAfterFire)
        : AbstractTimer(deleteAfterFire), mTarget(target), mMethod(method) {}

    T* getTarget() const { return mTarget; }

 private:
    T* mTarget;
    Method mMethod;
};

}  // namespace Foundation
