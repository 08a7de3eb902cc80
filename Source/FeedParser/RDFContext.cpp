#include "FeedParser/RDFContext.h"

#include "FeedParser/FriendContext.h"

namespace Orvane::FeedParser {

bool RDFContext::handleFinishedChild(Context* child) {
    switch (child->tag) {
        case ChannelTag:
        case ItemTag:
            sawChannelOrItem = true;
            break;
        case PersonTag:
            sawPerson = true;
            friend_ = static_cast<FriendContext*>(child)->friend_;
            return true;
        default:
            break;
    }
    return FeedContext::handleFinishedChild(child);
}

}  // namespace Orvane::FeedParser
