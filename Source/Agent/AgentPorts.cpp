#include "Agent/AgentPorts.h"

namespace Orvane {

AgentPorts::AgentPorts() {
    DocumentParser::setCurrent(&mParser);
    Housekeeping::setCurrent(&mHousekeeping);
}

AgentPorts::~AgentPorts() {
    Housekeeping::setCurrent(nullptr);
    DocumentParser::setCurrent(nullptr);
}

}  // namespace Orvane
