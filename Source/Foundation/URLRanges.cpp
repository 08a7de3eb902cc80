#include "Foundation/URLRanges.h"

namespace Foundation {

URLRanges::URLRanges(const URLParts& parts) {
    std::size_t next = 0;
    const auto add = [&](URL::Component which, std::optional<std::string_view> part,
                         std::size_t markLength) {
        Range& range = mRanges[static_cast<std::size_t>(which)];
        range = {next, next, next};
        if (!part) return;
        range.begin += markLength;
        range.end = range.begin + part->size();
        next = range.end;
    };
    add(URL::Component::Scheme, parts.scheme, 0);
    if (parts.scheme) ++next;  // its colon
    const std::size_t slashes = next;
    add(URL::Component::User, parts.user, 2);
    add(URL::Component::Host, parts.host, parts.user ? 1 : 2);
    if (parts.host && !parts.user) {
        const std::size_t begin = slashes + 2;
        mRanges[static_cast<std::size_t>(URL::Component::User)] = {slashes, begin, begin};
    }
    add(URL::Component::Port, parts.port, 1);
    add(URL::Component::Path, parts.path, 0);
    add(URL::Component::Query, parts.query, 1);
    add(URL::Component::Fragment, parts.fragment, 1);
}

}  // namespace Foundation
