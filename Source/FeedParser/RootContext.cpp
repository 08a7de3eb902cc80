#include "FeedParser/RootContext.h"

#include "FeedParser/EntryContext.h"
#include "FeedParser/PageContext.h"
#include "FeedParser/RDFContext.h"

namespace Orvane::FeedParser {

bool RootContext::handleFinishedChild(Context* child) {
    switch (child->tag) {
        case FeedTag:
        case RSSTag:
            info->kind = Info::FeedKind;
            info->feed = static_cast<FeedContext*>(child)->feed;
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

void RootContext::takeRDF(Context* child) {
    auto* rdf = static_cast<RDFContext*>(child);
    if (rdf->sawChannelOrItem) {
        info->kind = Info::FeedKind;
        info->feed = rdf->feed;
    } else if (rdf->sawPerson) {
        info->kind = Info::FriendKind;
        info->friend_ = rdf->friend_;
    }
}

}  // namespace Orvane::FeedParser
