#include "Bridges/PublicSession.h"

#include "Agent/Client/IPCClient.h"
#include "Bridges/PublicObjectFactory.h"
#include "FeedParser/ParserPort.h"
#include "Model/ClientSession.h"
#include "Model/DocumentParser.h"

namespace Orvane {

void PublicSession::connect() {
    if (PublicObjects::current()) return;
    // Never destroyed: rows ask them until the process ends.
    static auto* const sObjects = new PublicObjectFactory;
    static auto* const sParser = new FeedParser::ParserPort;
    PublicObjects::setCurrent(sObjects);
    DocumentParser::setCurrent(sParser);
    IPCClient::connect();
}

void PublicSession::open() {
    connect();
    ClientSession::open();
}

}  // namespace Orvane
