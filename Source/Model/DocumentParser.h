#pragma once

#include "Foundation/Returner.h"

namespace Orvane {

class EntryCore;
class FeedCore;

/// Who reads documents. Set once per process; null until then, and nothing can be read.
class DocumentParser {
 public:
    virtual ~DocumentParser() = default;

    // `url`, where the document comes from, may be null, and so may the data. What a document turns
    // out to be is a free object in no table. Whatever the bytes are, neither throws for them.

    /// The feed, with its entries, that a document is; null if it is anything else.
    virtual Foundation::Returner<FeedCore> parseFeed(Foundation::Data* data,
                                                     Foundation::URL* url) = 0;
    /// The same for a document that is a single entry. The entry has no feed.
    virtual Foundation::Returner<EntryCore> parseEntry(Foundation::Data* data,
                                                       Foundation::URL* url) = 0;

    static DocumentParser* current();
    /// The port must outlive its use.
    static void setCurrent(DocumentParser* port);
};

}  // namespace Orvane
