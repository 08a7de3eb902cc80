#pragma once

#include "FeedParser/Context.h"

namespace Orvane::FeedParser {

/// An element that means nothing here. Its children go with it.
class UnknownContext : public Context {
 public:
    explicit UnknownContext(Tag theLiteralTag) : Context(UnknownTag), literalTag(theLiteralTag) {}

    Tag getLiteralTag() const override { return literalTag; }

    /// Of the name, which may be a known one in an unknown vocabulary.
    const Tag literalTag;
};

}  // namespace Orvane::FeedParser
