#include "FeedParser/DocumentReader.h"

#include "FeedParser/Parser.h"

namespace Orvane::FeedParser {

using Foundation::Data;
using Foundation::Returner;
using Foundation::URL;

Returner<FeedCore> DocumentReader::parseFeed(Data* data, URL* url) {
    const Parser parser(data, url);
    return Returner<FeedCore>::retained(parser.getInfo()->getFeed());
}

Returner<EntryCore> DocumentReader::parseEntry(Data* data, URL* url) {
    const Parser parser(data, url);
    return Returner<EntryCore>::retained(parser.getInfo()->getEntry());
}

}  // namespace Orvane::FeedParser
