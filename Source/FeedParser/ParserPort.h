#pragma once

#include "Model/DocumentParser.h"

namespace Orvane::FeedParser {

/// What rows ask of documents, by a `Parser` for each.
class ParserPort : public DocumentParser {
 public:
    Foundation::Returner<FeedCore> parseFeed(Foundation::Data* data, Foundation::URL* url) override;
    Foundation::Returner<EntryCore> parseEntry(Foundation::Data* data,
                                               Foundation::URL* url) override;
};

}  // namespace Orvane::FeedParser
