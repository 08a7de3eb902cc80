#pragma once

#include "Foundation/Timer.h"
#include "Model/Housekeeping.h"

namespace Orvane {

/// What the agent's task does for rows and migrations that ask for it. There must be a task while
/// it is asked, and while it has still to do something.
class AgentHousekeeping : public Housekeeping {
 public:
    void updateAllUnreadCountsSoon() override;
    int expungeOldArticles() override;

 private:
    void updateAllUnreadCounts();

    Foundation::Timer<AgentHousekeeping> mTimer{this, &AgentHousekeeping::updateAllUnreadCounts};
};

}  // namespace Orvane
