#include "FeedParser/FriendContext.h"

#include "FeedParser/KnowsContext.h"
#include "FeedParser/URLContext.h"

namespace Orvane::FeedParser {

void FriendContext::start() {
    if (info->kind != Info::UnknownKind) return;
    info->kind = Info::FriendKind;
    info->friend_ = friend_;
}

bool FriendContext::handleFinishedChild(Context* child) {
    const auto text = [&] { return static_cast<TextContext*>(child)->getText(); };
    switch (child->tag) {
        case FamilyNameTag:
        case SurNameTag:
            friend_->mFamilyName = text();
            return true;
        case FirstNameTag:
        case GivenNameTag:
            friend_->mFirstName = text();
            return true;
        case HomepageTag:
        case WeblogTag:
            friend_->mURL = static_cast<URLContext*>(child)->getURL();
            return true;
        case NickTag:
            friend_->mNick = text();
            return true;
        case NameTag:
            friend_->mName = text();
            return true;
        case KnowsTag:
            friend_->addKnown(static_cast<KnowsContext*>(child)->people.get());
            return true;
        default:
            return false;
    }
}

}  // namespace Orvane::FeedParser
