#include "FeedParser/KnowsContext.h"

#include "FeedParser/FriendContext.h"

namespace Orvane::FeedParser {

bool KnowsContext::handleFinishedChild(Context* child) {
    if (child->tag != PersonTag) return false;
    people->add(static_cast<FriendContext*>(child)->friend_.get());
    return true;
}

}  // namespace Orvane::FeedParser
