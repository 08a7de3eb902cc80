#include "FeedParser/Text/SafeURL.h"

#include "FeedParser/Text/XMLCharacters.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"

#include <algorithm>
#include <iterator>

namespace Orvane::FeedParser {

using Foundation::Ref;
using Foundation::String;
using Foundation::URL;

namespace {

constexpr auto npos = std::string_view::npos;

/// What may be followed by a click. Everything else may run something.
constexpr std::string_view kLinkSchemes[] = {
    "callto", "feed", "feeds",  "ftp",    "ftps", "geo",    "gopher", "http", "https",
    "irc",    "ircs", "magnet", "mailto", "mms",  "news",   "nntp",   "rtsp", "sftp",
    "sip",    "sips", "sms",    "tel",    "urn",  "webcal", "xmpp",
};
constexpr std::string_view kImageSchemes[] = {"ftp", "http", "https"};
/// Pictures that are nothing but pixels. SVG is not: it may hold scripts.
constexpr std::string_view kPictures[] = {
    "data:image/avif;base64,", "data:image/bmp;base64,",    "data:image/gif;base64,",
    "data:image/jpeg;base64,", "data:image/jpg;base64,",    "data:image/png;base64,",
    "data:image/webp;base64,", "data:image/x-icon;base64,",
};

bool isSpaceOrControl(char c) {
    return static_cast<unsigned char>(c) <= 0x20 || c == 0x7F;
}

bool isBase64(char c) {
    return XMLCharacters::isLetter(c) || XMLCharacters::isDigit(c) || c == '+' || c == '/' ||
           c == '=';
}

/// As browsers read it: without the spaces and control characters around it, and without line
/// breaks and control characters inside (WHATWG URL, "basic URL parser").
std::string cleanURL(std::string_view url) {
    while (!url.empty() && isSpaceOrControl(url.front()))
        url.remove_prefix(1);
    while (!url.empty() && isSpaceOrControl(url.back()))
        url.remove_suffix(1);
    std::string clean(url);
    const auto isControl = [](char c) { return isSpaceOrControl(c) && c != ' '; };
    clean.erase(std::remove_if(clean.begin(), clean.end(), isControl), clean.end());
    return clean;
}

/// All in front of the first colon that no "/", "?" or "#" comes before, in lower case; none if
/// there is no such colon. It need not be a scheme that could be one.
std::optional<std::string> schemeOf(std::string_view url) {
    const std::size_t end = url.find_first_of(":/?#\\");
    if (end == npos || url[end] != ':') return std::nullopt;
    return XMLCharacters::toLower(url.substr(0, end));
}

bool isPicture(std::string_view url) {
    constexpr std::size_t kLongestStart = 32;
    const std::string start = XMLCharacters::toLower(url.substr(0, kLongestStart));
    for (const std::string_view picture : kPictures) {
        if (!start.starts_with(picture)) continue;
        return std::all_of(url.begin() + static_cast<std::ptrdiff_t>(picture.size()), url.end(),
                           isBase64);
    }
    return false;
}

bool isAllowed(const std::string& scheme, SafeURL::Use use) {
    const auto isIn = [&scheme](const auto& list) {
        return std::find(std::begin(list), std::end(list), scheme) != std::end(list);
    };
    return use == SafeURL::Use::Link ? isIn(kLinkSchemes) : isIn(kImageSchemes);
}

/// Whether a word of a "srcset" is a size: "2x", "1.5x", "640w".
bool isSize(std::string_view word) {
    if (word.size() < 2 || word.size() > 16) return false;
    if (std::string_view("xwh").find(word.back()) == npos) return false;
    return word.substr(0, word.size() - 1).find_first_not_of("0123456789.") == npos;
}

/// Takes the text up to one of `ends` off the front of `list`.
std::string_view take(std::string_view& list, const char* ends) {
    const std::string_view taken = list.substr(0, list.find_first_of(ends));
    list.remove_prefix(taken.size());
    return taken;
}

}  // namespace

std::string SafeURL::makeAbsolute(const std::string& url) const {
    if (!mBase) return url;
    if (url.empty()) return mBase->getAbsoluteString()->utf8();
    const Ref<URL> absolute = URL::lenientURL(String::string(url), mBase);
    if (!absolute || !absolute->hasScheme()) return url;
    return absolute->getAbsoluteString()->utf8();
}

std::optional<std::string> SafeURL::make(std::string_view url, Use use) const {
    std::string clean = cleanURL(url);
    const std::optional<std::string> scheme = schemeOf(clean);
    if (scheme) {
        const bool isSafe = isAllowed(*scheme, use) || (use == Use::Image && isPicture(clean));
        return isSafe ? std::optional(std::move(clean)) : std::nullopt;
    }
    std::string absolute = makeAbsolute(clean);
    const std::optional<std::string> newScheme = schemeOf(absolute);
    // What counts from a file, say, leads nowhere that may be shown.
    if (newScheme && !isAllowed(*newScheme, use)) return std::nullopt;
    return absolute;
}

std::optional<std::string> SafeURL::makeSourceSet(std::string_view list) const {
    std::string result;
    constexpr const char* kSpace = " \t\r\n\f";
    for (;;) {
        list.remove_prefix(std::min(list.find_first_not_of(" \t\r\n\f,"), list.size()));
        if (list.empty()) break;
        std::string_view url = take(list, kSpace);
        std::string_view sizes;
        if (url.ends_with(',')) {
            url = url.substr(0, url.find_last_not_of(',') + 1);
        } else {
            sizes = take(list, ",");
        }
        const std::optional<std::string> safe = make(url, Use::Image);
        if (!safe || safe->find_first_of(" ,") != npos) continue;
        if (!result.empty()) result += ", ";
        result += *safe;
        sizes.remove_prefix(std::min(sizes.find_first_not_of(kSpace), sizes.size()));
        const std::string_view size = take(sizes, kSpace);
        if (isSize(size)) (result += ' ') += size;
    }
    return result.empty() ? std::nullopt : std::optional(std::move(result));
}

}  // namespace Orvane::FeedParser
