#include "Foundation/SessionApplications.h"

#include <limits>
#include <utility>

namespace Foundation {

SessionApplications::SessionApplications(Bus& bus, FindProcesses findProcesses)
    : mBus(bus),
      mFindProcesses(std::move(findProcesses)),
      mLookAgain(this, &SessionApplications::noteChange),
      mNameWatch(bus.watchName("", [this](auto&&...) { noteChange(); })) {}

bool SessionApplications::isRunning(const std::string& lowerCasedIdentifier) {
    if (!mIsListed) list();
    return mIdentifiers.contains(lowerCasedIdentifier);
}

void SessionApplications::noteChange() {
    mIsListed = false;
    mLookAgain.stop();
    mSeed = mSeed == std::numeric_limits<std::int32_t>::max() ? 0 : mSeed + 1;
}

void SessionApplications::list() {
    mIdentifiers = mFindProcesses();
    for (std::string& name : mBus.listNames()) {
        const bool isUnique = name.starts_with(':');
        if (isUnique) continue;
        mIdentifiers.insert(lowerCased(std::move(name)));
    }
    mIsListed = true;
    mLookAgain.start(kProcessesHoldSeconds, false);
}

}  // namespace Foundation
