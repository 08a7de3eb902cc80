#include "Agent/AgentHousekeeping.h"

#include "Agent/AgentTask.h"

namespace Orvane {

void AgentHousekeeping::updateAllUnreadCountsSoon() {
    mTimer.start(0.0, false);
}

void AgentHousekeeping::updateAllUnreadCounts() {
    AgentTask::sharedInstance().updateAllUnreadCounts();
}

int AgentHousekeeping::expungeOldArticles() {
    return AgentTask::sharedInstance().expungeOldArticles();
}

}  // namespace Orvane
