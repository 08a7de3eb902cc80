#pragma once

#include "Foundation/Bus.h"
#include "Foundation/RunningApplications.h"
#include "Foundation/Timer.h"
#include "Foundation/Uncopyable.h"

#include <functional>
#include <set>
#include <string>

namespace Foundation {

/// The applications of the user's session: the well-known names on the message bus, each of which
/// is an application's identifier, and what `RunningProcesses` finds for those without such a name.
///
/// The bus tells of every name and every connection that comes or goes, and each moves the seed.
/// Nobody tells of processes that use no bus. So the seed also moves `kProcessesHoldSeconds` after
/// processes were looked at: an application that is found by its process alone is noticed, and
/// missed, at most that much late. Between two looks a question costs a look-up, and nothing
/// happens as long as nobody asks.
class SessionApplications : public RunningApplications, Uncopyable {
 public:
    static constexpr double kProcessesHoldSeconds = 30.0;
    using FindProcesses = std::function<std::set<std::string>()>;

    /// REQUIRES: used on the bus's thread.
    SessionApplications(Bus& bus, FindProcesses findProcesses);

    std::int32_t getSeed() override { return mSeed; }
    bool isRunning(const std::string& lowerCasedIdentifier) override;

 private:
    void noteChange();
    void list();

    Bus& mBus;
    FindProcesses mFindProcesses;
    std::int32_t mSeed = 0;
    bool mIsListed = false;
    std::set<std::string> mIdentifiers;  ///< in lower case, as of the last look
    Timer<SessionApplications> mLookAgain;
    BusSubscriptionPtr mNameWatch;
};

}  // namespace Foundation
