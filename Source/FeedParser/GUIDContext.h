#pragma once

#include "FeedParser/URLContext.h"

namespace Orvane::FeedParser {

/// The ID of an RSS item, which is the URL of its page as well unless it says that it is not.
class GUIDContext : public URLContext {
 public:
    using URLContext::URLContext;

    void gotAttribute(const char* prefix, const char* name, const char* value) override;

    bool isPermaLink = true;
};

}  // namespace Orvane::FeedParser
