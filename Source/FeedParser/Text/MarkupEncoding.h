#pragma once

#include <string>
#include <string_view>

namespace Orvane::FeedParser {

/// Finds out in what encoding markup stands.
struct MarkupEncoding {
    /// libxml2's number of ISO-8859-1, which has a character for each byte.
    static constexpr int kLatin1 = 10;

    /// Markup, in UTF-8 or as it came.
    struct Text {
        std::string bytes;
        bool isUTF8;
    };

    /// The markup as UTF-8, if its encoding is known: by a byte order mark, by `encoding`, which is
    /// an `xmlCharEncoding` of libxml2, by what the markup declares, or because it is UTF-8. What
    /// is no text in the encoding becomes U+FFFD. ISO-8859-1 and ASCII are read as windows-1252,
    /// which is what pages mean by them. Without a known encoding the bytes stay as they are.
    /// Declarations in the markup are left alone.
    static Text toUTF8(std::string_view bytes, int encoding);

    /// The encoding that an XML declaration or a `meta` element at the start of the markup gives;
    /// empty for none.
    static std::string getDeclared(std::string_view markup);
};

}  // namespace Orvane::FeedParser
