#include "FeedParser/ImageContext.h"

#include "FeedParser/URLContext.h"

namespace Orvane::FeedParser {

bool ImageContext::handleFinishedChild(Context* child) {
    if (child->tag == URLTag) url = static_cast<URLContext*>(child)->getURL();
    return true;
}

}  // namespace Orvane::FeedParser
