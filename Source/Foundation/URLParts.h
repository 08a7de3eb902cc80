#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace Foundation {

/// A URL, or relative reference, taken apart as RFC 3986 has it. The parts are views of the text
/// that was parsed, without the marks between them; what is absent differs from what is empty.
struct URLParts {
    std::optional<std::string_view> scheme;
    std::optional<std::string_view> user;  ///< all before the "@", a password included
    std::optional<std::string_view> host;  ///< with the brackets of an address; absent without "//"
    std::optional<std::string_view> port;
    std::string_view path;
    std::optional<std::string_view> query;
    std::optional<std::string_view> fragment;

    /// The parts of `text`, or nothing where it does not follow the grammar to the letter.
    static std::optional<URLParts> parse(std::string_view text);

    /// Whether the path is one of segments under a root. Without that, everything behind the
    /// scheme is its own matter, as in "mailto:".
    bool isHierarchical() const { return !scheme || host || path.starts_with('/'); }
};

/// The text of the URL that `reference` stands for seen from `base` (section 5.2). A reference
/// with a scheme gives its own text, dots included: two ways to come by a URL give one text. Where
/// neither has a root, ".." stops at the start of the base.
std::string resolveURL(const URLParts& base, const URLParts& reference);

/// Removes the segments "." and "..", and those that ".." takes back (section 5.2.4).
std::string removeDotSegments(std::string_view path);

}  // namespace Foundation
