#pragma once

#include "FeedParser/Context.h"
#include "FeedParser/Friend.h"

namespace Orvane::FeedParser {

/// A person of a FOAF document.
class FriendContext : public Context {
 public:
    explicit FriendContext(Tag theTag) : Context(theTag), friend_(new Friend) {}

    bool handleFinishedChild(Context* child) override;
    /// A person is what the document is, unless that is known to be something else.
    void start() override;

    Foundation::Ref<Friend> friend_;
};

}  // namespace Orvane::FeedParser
