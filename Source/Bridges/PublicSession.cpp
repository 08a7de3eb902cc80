#include "Bridges/PublicSession.h"

#include "Agent/Client/IPCClient.h"
#include "Bridges/PublicObjectFactory.h"
#include "FeedParser/ParserPort.h"
#include "Model/ClientSession.h"
#include "Model/DocumentParser.h"

namespace Orvane {

void PublicSession::connect() {
    // Never destroyed: rows ask them until the process ends.
    static auto* const sObjects = new PublicObjectFactory;
    static auto* const sParser = new FeedParser::ParserPort;
    if (!PublicObjects::current()) PublicObjects::setCurrent(sObjects);
    if (!DocumentParser::current()) DocumentParser::setCurrent(sParser);
}

void PublicSession::open() {
    connect();
    IPCClient::connect();
    ClientSession::open();
}

}  // namespace Orvane
