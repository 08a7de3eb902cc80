#include "FeedParser/Text/HTMLPage.h"

namespace Orvane {

using namespace Foundation;

HTMLPage::HTMLPage() : mLinks(MutableArrayOf<HTMLLink>::array()) {}

void HTMLPage::addLink(HTMLLink* link) {
    if (link) mLinks->add(link);
}

void HTMLPage::setBaseURL(URL* url) {
    mBaseURL = url;
    for (HTMLLink* link : *mLinks.get()) {
        link->mBaseURL = url;
    }
}

}  // namespace Orvane
