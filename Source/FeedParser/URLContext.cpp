#include "FeedParser/URLContext.h"

namespace Orvane::FeedParser {

using Foundation::Ref;
using Foundation::String;
using Foundation::URL;

Foundation::URLReturner URLContext::getURL() const {
    String* urlText = getText();
    if (!urlText) return nullptr;
    const Ref<URL> base = getBaseURL();
    const Ref<URL> url = URL::lenientURL(urlText, base.get());
    return URL::getSanitizedURL(url.get());
}

}  // namespace Orvane::FeedParser
