#include "Foundation/ProcessInfo.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "Foundation/RunningApplications.h"

namespace Foundation {

ProcessInfo::ProcessInfo(String* bundleID) : mBundleID(bundleID) {}

void ProcessInfo::setBundleID(String* bundleID) {
    if (IsEqual(mBundleID, bundleID)) return;
    mBundleID = StringReturner::retained(bundleID);
    mSeed = kNothingCached;
}

bool ProcessInfo::isRunning() {
    OV_ASSERT_AS(mBundleID, "mBundleID");
    RunningApplications& applications = RunningApplications::current();
    const std::int32_t seed = applications.getSeed();
    if (seed == mSeed) return mIsRunning;
    mSeed = seed;
    mIsRunning = applications.isRunning(RunningApplications::lowerCased(mBundleID->utf8()));
    gLog.log("ProcessInfo::isRunning(\"%@\") = %i", mBundleID, mIsRunning);
    return mIsRunning;
}

}  // namespace Foundation
