#include "Agent/AgentName.h"

#include "Foundation/Bus.h"
#include "Foundation/BusCenter.h"
#include "Foundation/Clock.h"
#include "Foundation/Logger.h"
#include "Foundation/RunLoop.h"

namespace Orvane {

using namespace Foundation;

namespace {

constexpr int kTries = 3;

}  // namespace

AgentName::Claim AgentName::claim() {
    Bus& bus = Bus::user();
    for (int i = 0; i < kTries; ++i) {
        if (bus.requestName(BusCenter::kAgentName)) return Claim::kOurs;
        if (!bus.isConnected()) break;
        // Whoever had it may just have given it up.
        if (!bus.getNameOwner(BusCenter::kAgentName).empty()) return Claim::kTaken;
    }
    return Claim::kNoBus;
}

void AgentName::giveUp() {
    Bus& bus = Bus::user();
    if (!bus.isConnected()) return;
    // The answer comes behind all calls that the bus has sent to the name.
    bus.releaseName(BusCenter::kAgentName);
    // Turn by turn, and on behind a signal that ends a run: to be sent one now is nothing new.
    const double end = Clock::current().now() + kServeSeconds;
    while (Clock::current().now() < end) {
        const RunLoop::Result result = RunLoop::current().runInMode(RunLoop::kDefaultMode, 0, true);
        if (result == RunLoop::Result::TimedOut) break;
    }
    bus.flush(kServeSeconds);
}

}  // namespace Orvane
