#include "Agent/OVAgentFrameworkMain.h"

#include "Agent/AbsentRenderer.h"
#include "Agent/AgentLock.h"
#include "Agent/AgentName.h"
#include "Agent/AgentPorts.h"
#include "Agent/AgentTask.h"
#include "Agent/IPCServer.h"
#include "Agent/LaunchListener.h"
#include "Foundation/ApplicationIdentity.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/BusCenter.h"
#include "Foundation/Logger.h"
#include "Foundation/RunLoop.h"
#include "Net/MemoryReturn.h"

#include <csignal>

using namespace Foundation;

namespace Orvane {

namespace {

constexpr const char* kIdentifier = "com.tarnwick.Orvane.Agent";

/// Whether this process is to be the agent. Others would write to the same database.
bool isAgent(AgentLock& lock) {
    const AgentName::Claim claim = AgentName::claim();
    if (claim == AgentName::Claim::kTaken) {
        gLog.log("Another process owns %s: leaving it the work", BusCenter::kAgentName);
        return false;
    }
    const bool hasName = claim == AgentName::Claim::kOurs;
    if (!hasName) gWarn.log("No message bus: the agent goes on, but nobody can call it");
    // Who had the name before may still be about to close the database.
    if (lock.take(hasName ? AgentLock::kWaitSeconds : 0)) return true;
    gLog.log("Another process works on the storage: leaving it the work");
    return false;
}

/// Whether there is anything to be run.
bool setUp(AgentTask& task, AgentLock& lock, AbsentRenderer& renderer) {
    const AutoreleasePool pool;
    gLog.log("----- Orvane Agent STARTING -----");
    LaunchListener& listener = *LaunchListener::instance();
    listener.registerSignal(SIGTERM);
    std::signal(SIGPIPE, SIG_IGN);
    // First of all that touches the database: there are never two who write to it.
    if (!isAgent(lock)) {
        // This one was started for them, and would be again.
        AbsentRenderer::turnAwayWaiting(listener);
        return false;
    }
    task.start(true);
    gLog.log("Orvane Agent starting API MIG server");
    IPCServer::startServer();
    renderer.startServer(listener);
    gLog.log("Orvane Agent finished setup; starting runloop");
    return true;
}

void run() {
    const AgentPorts ports;
    AgentLock lock;
    AbsentRenderer renderer;
    AgentTask task;
    if (!setUp(task, lock, renderer)) return;
    RunLoop::current().run();
    gLog.log("Orvane Agent exited runloop");
    AgentName::giveUp();
}

}  // namespace

}  // namespace Orvane

int OVAgentFrameworkMain() {
    using namespace Orvane;
    int status = 0;
    try {
        MemoryReturn::keepRoomForDocuments();
        ApplicationIdentity::setIdentifier(kIdentifier);
        run();
    } catch (...) {
        warnAboutCurrentException("int OVAgentFrameworkMain()");
        status = 1;
    }
    gLog.log("----- Orvane Agent EXITING with status %i -----\n\n", status);
    return status;
}
