#include "FeedParser/Friend.h"

#include "Foundation/FormatObjects.h"

namespace Orvane {

using Foundation::ArrayOf;
using Foundation::String;

String* Friend::getName() {
    if (mName.get()) {
        mDisplayName = mName;
    } else if (mFirstName.get() && mFamilyName.get()) {
        mDisplayName = String::stringWithFormat("%@ %@", mFirstName.get(), mFamilyName.get());
    } else {
        mDisplayName = mFirstName.get() ? mFirstName : mNick;
    }
    return mDisplayName;
}

void Friend::addKnown(Friend* known) {
    mKnows->add(known);
}

void Friend::addKnown(const ArrayOf<Friend>* known) {
    mKnows->addAll(known);
}

}  // namespace Orvane
