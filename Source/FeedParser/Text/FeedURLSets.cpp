#include "FeedParser/Text/FeedURLUtilsCore.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "Foundation/String.h"
#include "Foundation/URLCharacters.h"

#include <strings.h>

#include <algorithm>
#include <vector>

// The URLs of sets of feeds.

namespace Orvane {

using Foundation::gLog;
using Foundation::gWarn;
using Foundation::MutableArrayOf;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using Foundation::URL;
using Foundation::URLReturner;

namespace {

constexpr std::string_view kUUID = "uuid:";
constexpr std::string_view kFilter = "filter:";

/// Whether a text begins with ASCII in any case.
bool beginsWith(std::string_view text, std::string_view start) {
    return text.size() >= start.size() && strncasecmp(text.data(), start.data(), start.size()) == 0;
}

std::string replaceAll(std::string_view text, std::string_view what, std::string_view with) {
    std::string result;
    for (;;) {
        const std::size_t found = text.find(what);
        result += text.substr(0, found);
        if (found == std::string_view::npos) return result;
        result += with;
        text.remove_prefix(found + what.size());
    }
}

/// A text of which everything comes back by `unescapeURLText`.
std::string escaped(const String* text) {
    return Foundation::escapeURLText(String::view(text), "&");
}

/// A URL without its scheme, and without the slashes behind that.
Ref<String> withoutScheme(const URL* url) {
    std::string_view text = url->text();
    const std::size_t colon = text.find(':');
    if (colon != std::string_view::npos) text.remove_prefix(colon + 1);
    if (text.starts_with("//")) text.remove_prefix(2);
    return String::string(std::string(text));
}

std::vector<Ref<String>> sortedFeeds(const FeedURLUtilsCore::URLs* urls) {
    std::vector<Ref<String>> feeds;
    if (!urls) return feeds;
    for (const URL* url : *urls) {
        feeds.push_back(withoutScheme(url));
    }
    std::stable_sort(feeds.begin(), feeds.end(), [](const Ref<String>& a, const Ref<String>& b) {
        const int order = Compare(a.get(), b.get(), Foundation::CompareOptions::CaseInsensitive);
        // What differs by case alone must not stand as the caller has it.
        return order != 0 ? order < 0 : a->view() < b->view();
    });
    return feeds;
}

/// What follows the prefix of a set's URL.
std::string_view behindPrefix(std::string_view text) {
    if (beginsWith(text, "feeds")) return text.substr(std::min<std::size_t>(6, text.size()));
    if (beginsWith(text, "feed")) text.remove_prefix(std::min<std::size_t>(5, text.size()));
    OV_ASSERT_AS(beginsWith(text, "multi:"), "urlString->hasPrefix(PFSTR(\"multi:\"))");
    return text.substr(6);
}

Ref<String> unescaped(std::string_view text) {
    const std::optional<std::string> plain = Foundation::unescapeURLText(text);
    return plain ? Ref<String>(String::stringOfUTF8(*plain)) : nullptr;
}

/// Sets what is null yet; anything more draws a warning.
void setOnce(Ref<String>& value, Ref<String> found, const char* what, const URL* url) {
    if (value.get()) {
        gWarn.log("FeedURLUtilsCore: Multiple %s in <%@>", what, url);
    } else {
        value = std::move(found);
    }
}

/// The URL of a feed; null if it is none.
Ref<URL> feedURL(const std::string& part) {
    if (part.empty()) return nullptr;
    const bool hasScheme = part.find("://") != std::string::npos;
    const Ref<String> text = String::stringOfUTF8((hasScheme ? "" : "http://") + part);
    return text.get() ? Ref<URL>(URL::url(text.get())) : nullptr;
}

}  // namespace

URLReturner FeedURLUtilsCore::feedURLForSourceURL(URL* url) {
    if (!url || isKnownURL(url)) return URLReturner::retained(url);
    const Ref<String> host = url->getHost();
    if (url->isScheme("http") && host.get() && host->contains(".")) {
        const Ref<String> specifier = url->getResourceSpecifier();
        return URL::url(String::stringWithFormat("feed:%@", specifier));
    }
    return URL::url(String::string("feed:" + url->text()));
}

URLReturner FeedURLUtilsCore::aggregateFeedURLFromComponents(const URLs* urls, const String* name,
                                                             const String* uuid,
                                                             const String* filter) {
    std::string text = "feeds:" + escaped(name);
    for (const Ref<String>& feed : sortedFeeds(urls)) {
        std::string_view plain = feed->view();
        if (plain.starts_with("http://")) plain.remove_prefix(7);
        // The text of a URL has no character that needs more.
        text += '&' + replaceAll(plain, "&", "%26");
    }
    if (uuid) text += "&uuid:" + escaped(uuid);
    if (filter) text += "&filter:" + escaped(filter);
    const Ref<String> string = String::string(text);
    return URL::lenientURL(string.get(), nullptr);
}

Returner<FeedURLUtilsCore::URLs> FeedURLUtilsCore::urlsFromAggregateFeedURL(URL* url,
                                                                            Ref<String>& name,
                                                                            Ref<String>& uuid,
                                                                            Ref<String>& filter) {
    name = uuid = filter = nullptr;
    const Ref<MutableArrayOf<URL>> urls = MutableArrayOf<URL>::array();
    if (!url) return Returner<URLs>(Ref<URLs>(urls.get()));
    std::string_view rest = behindPrefix(url->text());
    if (rest.starts_with('/')) {
        gLog.log("Invalid URL <%@>", url);
        return nullptr;
    }
    name = unescaped(rest.substr(0, rest.find('&')));
    if (!name.get()) name = String::string(std::string());
    for (std::size_t at = rest.find('&'); at != std::string_view::npos; at = rest.find('&')) {
        rest.remove_prefix(at + 1);
        const std::string part = replaceAll(rest.substr(0, rest.find('&')), "%26", "&");
        if (part.starts_with(kUUID)) {
            setOnce(uuid, String::stringOfUTF8(part.substr(kUUID.size())), "UUIDs", url);
        } else if (part.starts_with(kFilter)) {
            setOnce(filter, unescaped(part.substr(kFilter.size())), "filters", url);
        } else if (const Ref<URL> feed = feedURL(part); feed.get()) {
            urls->add(feed.get());
        }
    }
    return Returner<URLs>(Ref<URLs>(urls.get()));
}

URLReturner FeedURLUtilsCore::unfilteredAggregateURL(URL* url) {
    if (!isFeedsProtocolURL(url) || url->text().find("&filter:") == std::string::npos) {
        return URLReturner::retained(url);
    }
    return URL::url(String::string(unfilteredAggregateURLString(url->text())));
}

std::string FeedURLUtilsCore::unfilteredAggregateURLString(std::string_view text) {
    if (beginsWith(text, "feeds:")) text = text.substr(0, text.find("&filter:"));
    return std::string(text);
}

}  // namespace Orvane
