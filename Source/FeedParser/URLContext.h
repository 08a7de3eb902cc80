#pragma once

#include "FeedParser/PlainTextContext.h"

namespace Orvane::FeedParser {

/// An element whose text is a URL.
class URLContext : public PlainTextContext {
 public:
    using PlainTextContext::PlainTextContext;

    /// The URL, seen from the element's base; null if the text is none, or none that may be
    /// offered for a click.
    Foundation::URLReturner getURL() const;
};

}  // namespace Orvane::FeedParser
