#pragma once

#include "FeedParser/Context.h"
#include "Foundation/URL.h"

namespace Orvane::FeedParser {

/// The image of an RSS feed. Its title and its link are not the feed's.
class ImageContext : public Context {
 public:
    explicit ImageContext(Tag theTag) : Context(theTag) {}

    bool handleFinishedChild(Context* child) override;

    Foundation::Ref<Foundation::URL> url;
};

}  // namespace Orvane::FeedParser
