#include "FeedParser/Text/FeedURLUtilsCore.h"

#include "Foundation/Logger.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"

#include <string>
#include <string_view>

namespace Orvane {

using Foundation::gWarn;
using Foundation::Ref;
using Foundation::String;
using Foundation::URL;
using Foundation::URLReturner;

namespace {

/// The URL that stands in a "feed:" URL behind its colon and slashes.
std::string sourceIn(std::string_view text) {
    constexpr auto npos = std::string_view::npos;
    if (text.starts_with("//")) text.remove_prefix(2);
    const std::size_t colon = text.find(':'), dot = text.find('.'), slash = text.find('/');
    // A dotted name before the colon is a host with its port, and no scheme.
    const bool needsScheme = colon == npos || dot < colon;
    if (slash == 0 || slash == npos || slash > dot) {
        std::size_t limit = needsScheme ? dot : colon;
        for (std::size_t next = slash; next < limit; next = text.find('/')) {
            text.remove_prefix(next + 1);
            if (limit != npos) limit -= next + 1;
        }
    }
    return (needsScheme ? "http://" : "") + std::string(text);
}

}  // namespace

bool FeedURLUtilsCore::isFeedProtocolURL(const URL* url) {
    return url && url->isScheme("feed");
}

bool FeedURLUtilsCore::isFeedsProtocolURL(const URL* url) {
    return url && url->isScheme("feeds");
}

bool FeedURLUtilsCore::isKnownURL(const URL* url) {
    return isFeedProtocolURL(url) || isFeedsProtocolURL(url);
}

URLReturner FeedURLUtilsCore::sourceURLForFeedURL(const URL* url) {
    if (!isFeedProtocolURL(url)) return nullptr;
    const Ref<String> specifier = url->getResourceSpecifier();
    if (!specifier.get()) {
        gWarn.log("FeedURLUtilsCore: Couldn't parse feed URL <%@>", url);
        return nullptr;
    }
    const Ref<String> text = String::string(sourceIn(specifier->view()));
    Ref<URL> source = URL::url(text);
    if (source.get() && source->hasScheme()) return source;
    gWarn.log("Generated bogus source URL <%@> for <%@>. Nullifying.", text, url);
    return nullptr;
}

}  // namespace Orvane
