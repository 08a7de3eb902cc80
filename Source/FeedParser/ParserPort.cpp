#include "FeedParser/ParserPort.h"

#include "FeedParser/Info.h"
#include "FeedParser/Parser.h"

namespace Orvane::FeedParser {

using Foundation::Data;
using Foundation::Returner;
using Foundation::URL;

Returner<FeedCore> ParserPort::parseFeed(Data* data, URL* url) {
    return Returner<FeedCore>::retained(Parser(data, url).getInfo()->getFeed());
}

Returner<EntryCore> ParserPort::parseEntry(Data* data, URL* url) {
    return Returner<EntryCore>::retained(Parser(data, url).getInfo()->getEntry());
}

}  // namespace Orvane::FeedParser
