#pragma once

#include "FeedParser/Context.h"
#include "FeedParser/Friend.h"
#include "Foundation/ArrayOf.h"

namespace Orvane::FeedParser {

/// The people whom a person knows.
class KnowsContext : public Context {
 public:
    explicit KnowsContext(Tag theTag) : Context(theTag) {}

    bool handleFinishedChild(Context* child) override;

    Foundation::Ref<Foundation::MutableArrayOf<Friend>> people =
        Foundation::MutableArrayOf<Friend>::array();
};

}  // namespace Orvane::FeedParser
