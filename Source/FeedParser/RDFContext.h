#pragma once

#include "FeedParser/FeedContext.h"

namespace Orvane::FeedParser {

/// The root of RSS 1.0 and of a FOAF document: which of them, its children tell.
class RDFContext : public FeedContext {
 public:
    using FeedContext::FeedContext;

    bool handleFinishedChild(Context* child) override;

    bool sawChannelOrItem = false;
    Foundation::Ref<Friend> friend_;  ///< the last person
    bool sawPerson = false;
};

}  // namespace Orvane::FeedParser
