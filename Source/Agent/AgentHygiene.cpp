#include "Agent/AgentTask.h"

namespace Orvane {

void AgentTask::scheduleHygieneTasks() {}

void AgentTask::hygieneTasks() {}

}  // namespace Orvane
