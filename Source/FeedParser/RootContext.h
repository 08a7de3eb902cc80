#pragma once

#include "FeedParser/Context.h"

namespace Orvane::FeedParser {

/// Below the document's root: takes what the document is.
class RootContext : public Context {
 public:
    RootContext() : Context(RootTag) {}

    bool handleFinishedChild(Context* child) override;

 private:
    void takeFeed(Context* child);
    void takeRDF(Context* child);
};

}  // namespace Orvane::FeedParser
