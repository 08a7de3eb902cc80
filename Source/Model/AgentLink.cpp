#include "Model/AgentLink.h"

#include "Model/UnreachableAgent.h"

namespace Orvane {

namespace {

AgentLink* sCurrent = nullptr;
AgentLink::Maker sMaker = nullptr;

}  // namespace

AgentLink& AgentLink::current() {
    static UnreachableAgent sNone;
    if (sCurrent) return *sCurrent;
    return sMaker ? *sMaker() : sNone;
}

void AgentLink::setCurrent(AgentLink* link) {
    sCurrent = link;
}

void AgentLink::setMaker(Maker maker) {
    sMaker = maker;
}

}  // namespace Orvane
