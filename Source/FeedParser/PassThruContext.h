#pragma once

#include "FeedParser/Context.h"

namespace Orvane::FeedParser {

/// An element that only stands around others, such as the channel of RSS: its children are the
/// ancestors' own.
class PassThruContext : public Context {
 public:
    explicit PassThruContext(Tag theTag) : Context(theTag) {}

    bool handleFinishedChild(Context*) override { return false; }
};

}  // namespace Orvane::FeedParser
