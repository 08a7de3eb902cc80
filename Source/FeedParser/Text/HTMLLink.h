#pragma once

#include "Foundation/Ref.h"
#include "Foundation/RefCounted.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"

#include <cstdint>

namespace Orvane {

/// A `link` element of a page or a feed. Its attributes may each be null.
class HTMLLink : public Foundation::RefCounted {
 public:
    using String = Foundation::String;
    using URL = Foundation::URL;

    /// What a link leads to.
    enum Kind : std::int32_t {
        kNothing = 0,  ///< nothing of interest
        kRSSFeed = 1,
        kAtomFeed = 2,
        kAtomService = 3,
        kFOAFDocument = 4,
        kRSDDocument = 5,
        kSelf = 6,  ///< the feed itself
        kAlternatePage = 7,
    };

    HTMLLink() = default;
    HTMLLink(String* rel, String* type, String* title, String* href, URL* baseURL);

    /// The kind, by relations, type and title. Computed once: later changes of the fields don't
    /// alter it. A link without `mRel` is an alternate.
    std::int32_t getHTMLLinkType() const;

    /// Where the link leads, absolute where the base allows that. Null without `mHref`, and for
    /// what must not be offered for a click: see `URL::getSanitizedURL`.
    Foundation::URLReturner getURL() const;

    /// Whether a relation stands as a word in `mRel`, in any case. Without `mRel`, only "alternate"
    /// does. False for null.
    bool hasRel(const String* rel) const;
    bool isAlternate() const;

    Foundation::Ref<String> mRel;
    Foundation::Ref<String> mType;
    Foundation::Ref<String> mTitle;
    Foundation::Ref<String> mHref;
    Foundation::Ref<URL> mBaseURL;

 private:
    mutable std::int32_t mLinkType = -1;  ///< -1 until it is computed
};

}  // namespace Orvane
