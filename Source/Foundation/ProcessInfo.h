#pragma once

#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Foundation/Uncopyable.h"

#include <cstdint>

namespace Foundation {

/// Tells whether an application runs, at the cost of reading a number as long as the list of
/// running applications has not changed. Main thread.
class ProcessInfo : Uncopyable {
 public:
    /// `bundleID` is the application's identifier, in any case. May be null.
    explicit ProcessInfo(String* bundleID = nullptr);

    /// Names another application.
    void setBundleID(String* bundleID);
    /// Whether the application runs. Throws `AssertionFailure` without an identifier.
    bool isRunning();

 private:
    static constexpr std::int32_t kNothingCached = -1;

    Ref<String> mBundleID;
    bool mIsRunning = false;
    std::int32_t mSeed = kNothingCached;  ///< of the list that `mIsRunning` was taken from
};

}  // namespace Foundation
