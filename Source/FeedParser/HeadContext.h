#pragma once

#include "FeedParser/PassThruContext.h"

namespace Orvane::FeedParser {

/// The head of a page, behind which nothing is read.
class HeadContext : public PassThruContext {
 public:
    using PassThruContext::PassThruContext;

    void end() override { info->done = true; }
};

}  // namespace Orvane::FeedParser
