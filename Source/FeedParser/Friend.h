#pragma once

#include "Foundation/ArrayOf.h"
#include "Foundation/Ref.h"
#include "Foundation/RefCounted.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"

namespace Orvane {

/// A person as a FOAF document describes one. Every text and the URL may be null.
class Friend : public Foundation::RefCounted {
 public:
    /// What to call the person: the name, else first and family name, else the first name, else
    /// the nick; null if there is none. Lives until it is asked for anew.
    Foundation::String* getName();
    void addKnown(Friend* known);
    void addKnown(const Foundation::ArrayOf<Friend>* known);

    Foundation::Ref<Foundation::String> mDisplayName;  ///< what `getName` gave last
    Foundation::Ref<Foundation::String> mName;
    Foundation::Ref<Foundation::String> mFirstName;
    Foundation::Ref<Foundation::String> mFamilyName;
    Foundation::Ref<Foundation::String> mNick;
    Foundation::Ref<Foundation::URL> mURL;  ///< homepage or weblog
    Foundation::Ref<Foundation::MutableArrayOf<Friend>> mKnows =
        Foundation::MutableArrayOf<Friend>::array();
};

}  // namespace Orvane
