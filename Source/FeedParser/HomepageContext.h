#pragma once

#include "FeedParser/URLContext.h"

namespace Orvane::FeedParser {

/// The page of a person, whose URL is the element's text or its attribute "resource".
class HomepageContext : public URLContext {
 public:
    using URLContext::URLContext;

    void gotAttribute(const char* prefix, const char* name, const char* value) override;
};

}  // namespace Orvane::FeedParser
