#pragma once

#include "FeedParser/URLContext.h"

namespace Orvane::FeedParser {

/// The URL that a page says its links are relative to.
class BaseContext : public URLContext {
 public:
    using URLContext::URLContext;

    void gotAttribute(const char* prefix, const char* name, const char* value) override;
};

}  // namespace Orvane::FeedParser
