#include "Net/CacheDirectives.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/DateParser.h"
#include "Net/HTTPMessage.h"

#include <algorithm>

namespace Orvane {

namespace {

std::string_view trimmed(std::string_view text) {
    constexpr std::string_view kBlanks = " \t";
    const std::size_t begin = text.find_first_not_of(kBlanks);
    if (begin == std::string_view::npos) return {};
    return text.substr(begin, text.find_last_not_of(kBlanks) - begin + 1);
}

std::string_view unquoted(std::string_view text) {
    if (text.size() >= 2 && text.front() == '"' && text.back() == '"') {
        text = text.substr(1, text.size() - 2);
    }
    return text;
}

/// Calls `take(name, value)` for each directive of a `Cache-Control`.
template <class Take>
void forEachDirective(std::string_view list, Take take) {
    while (!list.empty()) {
        const std::size_t end = std::min(list.find(','), list.size());
        const std::string_view directive = list.substr(0, end);
        const std::size_t equals = std::min(directive.find('='), directive.size());
        const std::string_view value =
            equals < directive.size() ? directive.substr(equals + 1) : std::string_view();
        take(trimmed(directive.substr(0, equals)), unquoted(trimmed(value)));
        list.remove_prefix(std::min(end + 1, list.size()));
    }
}

/// Seconds that the response has been on its way through other caches.
double ageOf(const HTTPMessage& response) {
    return CacheDirectives::readSeconds(trimmed(response.getHeader("Age"))).value_or(0);
}

std::optional<double> lifetimeByExpires(const HTTPMessage& response, double now) {
    if (!response.hasHeader("Expires")) return {};
    const auto expires = CacheDirectives::readDate(response.getHeader("Expires"));
    if (!expires) return 0;  // "0" and the like: it is stale already
    // By the server's own clock, so that it does not matter if ours goes wrong.
    return *expires - CacheDirectives::readDate(response.getHeader("Date")).value_or(now);
}

}  // namespace

std::optional<double> CacheDirectives::readDate(std::string_view text) {
    const Foundation::AutoreleasePool pool;
    Foundation::Ref<Foundation::Date> date;
    Foundation::Ref<Foundation::TimeZone> zone = Foundation::TimeZone::fixedZone(0);
    if (!Foundation::parseDateText(std::string(trimmed(text)).c_str(), date, zone)) return {};
    if (!date) return {};
    return date->getAbsoluteTime();
}

std::optional<double> CacheDirectives::readSeconds(std::string_view text) {
    constexpr double kMost = 2147483648.0;
    if (text.empty()) return {};
    double seconds = 0;
    for (const char c : text) {
        if (c < '0' || c > '9') return {};
        seconds = std::min(seconds * 10 + (c - '0'), kMost);
    }
    return seconds;
}

CacheDirectives CacheDirectives::of(const HTTPMessage& response, double now) {
    CacheDirectives result;
    bool mustAsk = false;
    std::optional<double> maxAge;
    forEachDirective(response.getHeader("Cache-Control"),
                     [&](std::string_view name, std::string_view value) {
                         if (HTTPMessage::isSameName(name, "no-store")) result.mayBeStored = false;
                         if (HTTPMessage::isSameName(name, "no-cache")) mustAsk = true;
                         if (HTTPMessage::isSameName(name, "max-age")) {
                             maxAge = readSeconds(value).value_or(0);
                         }
                     });
    if (!response.hasHeader("Cache-Control") &&
        HTTPMessage::isSameName(trimmed(response.getHeader("Pragma")), "no-cache")) {
        mustAsk = true;
    }
    if (trimmed(response.getHeader("Vary")) == "*") result.mayBeStored = false;
    result.lifetime = maxAge ? maxAge : lifetimeByExpires(response, now);
    if (result.lifetime) *result.lifetime -= ageOf(response);
    if (mustAsk) result.lifetime = 0;
    return result;
}

}  // namespace Orvane
