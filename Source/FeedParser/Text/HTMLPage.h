#pragma once

#include "FeedParser/Text/HTMLLink.h"
#include "Foundation/ArrayOf.h"

namespace Orvane {

/// A web page, as far as it leads to feeds: its base and its links.
class HTMLPage : public Foundation::RefCounted {
 public:
    HTMLPage();

    /// Adds a link, which keeps its own base. Null adds nothing.
    void addLink(HTMLLink* link);
    /// Sets the page's base, which may be null, and that of every link so far. Needs a pool.
    void setBaseURL(Foundation::URL* url);

    Foundation::URL* getBaseURL() const { return mBaseURL; }
    /// In the order of the page.
    const Foundation::ArrayOf<HTMLLink>* getLinks() const { return mLinks; }

 private:
    Foundation::Ref<Foundation::URL> mBaseURL;
    Foundation::Ref<Foundation::MutableArrayOf<HTMLLink>> mLinks;
};

}  // namespace Orvane
