#pragma once

#include "Model/DocumentParser.h"

namespace Orvane::FeedParser {

/// Reads documents for the rows of the model, which do not know `Parser`.
class DocumentReader : public DocumentParser {
 public:
    Foundation::Returner<FeedCore> parseFeed(Foundation::Data* data, Foundation::URL* url) override;
    Foundation::Returner<EntryCore> parseEntry(Foundation::Data* data,
                                               Foundation::URL* url) override;
};

}  // namespace Orvane::FeedParser
