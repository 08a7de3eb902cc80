#include "FeedParser/RootContext.h"

#include "FeedParser/EntryContext.h"
#include "FeedParser/PageContext.h"
#include "FeedParser/RDFContext.h"

namespace Orvane::FeedParser {

bool RootContext::handleFinishedChild(Context* child) {
    switch (child->tag) {
        case FeedTag:
        case RSSTag:
            takeFeed(child);
            break;
        case EntryTag:
        case ItemTag:
            info->kind = Info::EntryKind;
            info->entry = static_cast<EntryContext*>(child)->entry;
            break;
        case HTMLTag:
            info->kind = Info::PageKind;
            info->page = static_cast<PageContext*>(child)->page;
            break;
        case RDFTag:
            takeRDF(child);
            break;
        default:
            break;
    }
    return true;
}

void RootContext::takeFeed(Context* child) {
    const auto* context = static_cast<FeedContext*>(child);
    info->kind = Info::FeedKind;
    info->feed = context->feed;
    info->description = context->description;
}

void RootContext::takeRDF(Context* child) {
    auto* rdf = static_cast<RDFContext*>(child);
    if (rdf->sawChannelOrItem) {
        takeFeed(rdf);
    } else if (rdf->sawPerson) {
        info->kind = Info::FriendKind;
        info->friend_ = rdf->friend_;
    }
}

}  // namespace Orvane::FeedParser
