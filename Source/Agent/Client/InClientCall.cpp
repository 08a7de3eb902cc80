#include "Agent/Client/InClientCall.h"

#include "Agent/RPC/AgentService.h"
#include "Foundation/Clock.h"
#include "Foundation/Utils.h"
#include "SQLite/Database.h"

#include <exception>

namespace Orvane {

using Foundation::Clock;

void InClientCall::begin() {
    mExceptions = std::uncaught_exceptions();
    mIsLogged = gLogIPC.willLog();
    if (mIsLogged) {
        gLogIPC.indent();
        mStartTime = Clock::current().now();
    }
    // The agent would wait for the lock that this process holds while it waits for the agent.
    if (!SQLite::gDatabase || SQLite::gDatabase->getTransactionDepth() < 1) return;
    Foundation::gWarn.log(
        "*** DANGER: Calling agent while in db transaction -- likely to deadlock ***");
    Compatibility::Utils::printStack(1, 10);
}

InClientCall::~InClientCall() {
    if (mIsLogged) {
        if (gLogIPC.willLog() && std::uncaught_exceptions() <= mExceptions) {
            gLogIPC.log("...took %.5lf sec", Clock::current().now() - mStartTime);
        }
        gLogIPC.outdent();
    }
    gOrvaneIPCTimeoutMS = kTimeoutMS;
}

}  // namespace Orvane
