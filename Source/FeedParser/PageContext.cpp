#include "FeedParser/PageContext.h"

#include "FeedParser/BaseContext.h"
#include "FeedParser/LinkContext.h"
#include "FeedParser/Text/Bounds.h"

namespace Orvane::FeedParser {

using Foundation::Ref;
using Foundation::URL;

void PageContext::start() {
    const Ref<URL> base = getBaseURL();
    page->setBaseURL(base.get());
}

bool PageContext::handleFinishedChild(Context* child) {
    if (child->tag == LinkTag) {
        page->addLink(static_cast<LinkContext*>(child)->link.get());
        return true;
    }
    if (child->tag != BaseTag) return false;
    // Each changes all links so far.
    if (mBases == Bounds::kPageBases) Bounds::logHit("bases of a page", Bounds::kPageBases);
    if (mBases++ >= Bounds::kPageBases) return true;
    const Ref<URL> url = static_cast<BaseContext*>(child)->getURL();
    page->setBaseURL(url.get());
    return true;
}

}  // namespace Orvane::FeedParser
