#include "Agent/AgentPorts.h"

namespace Orvane {

AgentPorts::AgentPorts() {
    DocumentParser::setCurrent(&mParser);
}

AgentPorts::~AgentPorts() {
    DocumentParser::setCurrent(nullptr);
}

}  // namespace Orvane
