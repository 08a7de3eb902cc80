#pragma once

#include "Agent/AgentHousekeeping.h"
#include "FeedParser/ParserPort.h"
#include "Foundation/Uncopyable.h"
#include "Net/NetPorts.h"

namespace Orvane {

/// What the model asks of higher layers, connected for the agent's process while this lives.
class AgentPorts : Foundation::Uncopyable {
 public:
    AgentPorts();
    ~AgentPorts();

 private:
    FeedParser::ParserPort mParser;
    AgentHousekeeping mHousekeeping;
    NetPorts mNet;
};

}  // namespace Orvane
