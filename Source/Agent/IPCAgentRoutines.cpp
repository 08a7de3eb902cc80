// What clients ask of the agent itself.

#include "Agent/AgentTask.h"
#include "Agent/IPCRoutines.h"

namespace Orvane {

void ipc_impl_fix_database(std::int32_t errorCode) {
    AgentTask::sharedInstance().fixDatabaseRequested(errorCode);
}

void ipc_impl_get_socket_path(const std::string&, std::string&) {
    // Nothing listens: pages are not rendered yet.
}

void ipc_impl_start_skerry_sync(std::int32_t& started) {
    // There is nothing to exchange states with yet.
    started = 0;
}

}  // namespace Orvane
