#include "Model/AgentLink.h"

#include "Model/UnreachableAgent.h"

namespace Orvane {

namespace {

AgentLink* sCurrent = nullptr;

}  // namespace

AgentLink& AgentLink::current() {
    static UnreachableAgent sNone;
    return sCurrent ? *sCurrent : sNone;
}

void AgentLink::setCurrent(AgentLink* link) {
    sCurrent = link;
}

}  // namespace Orvane
