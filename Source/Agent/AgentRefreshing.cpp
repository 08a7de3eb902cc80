#include "Agent/AgentTask.h"

namespace Orvane {

void AgentTask::scheduleNextRefresh() {}

void AgentTask::refreshSoon(Notification*) {}

void AgentTask::networkChanged(Notification*) {}

}  // namespace Orvane
