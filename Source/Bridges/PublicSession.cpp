#include "Bridges/PublicSession.h"

#include "Agent/Client/IPCClient.h"
#include "Bridges/PublicObjectFactory.h"
#include "FeedParser/ParserPort.h"
#include "Model/ClientSession.h"
#include "Model/DocumentParser.h"
#include "Net/NetPorts.h"

namespace Orvane {

void PublicSession::connect() {
    if (PublicObjects::current()) return;
    // Never destroyed: rows ask them until the process ends.
    static auto* const sObjects = new PublicObjectFactory;
    static auto* const sParser = new FeedParser::ParserPort;
    static const auto* const sNet = new NetPorts;  // connects itself
    static_cast<void>(sNet);
    PublicObjects::setCurrent(sObjects);
    DocumentParser::setCurrent(sParser);
    IPCClient::connect();
}

void PublicSession::open() {
    connect();
    ClientSession::open();
}

}  // namespace Orvane
