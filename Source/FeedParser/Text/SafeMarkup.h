#pragma once

#include "Foundation/URL.h"

#include <string>

namespace Orvane::FeedParser {

/// The pass over tidied content that makes it safe to show within a page of ours, and at home
/// there. Nothing goes through but what is listed (`HTMLElement`, `ForeignElements`,
/// `SafeAttributes`): no script, no event handler, no style sheet, no plug-in, no form that acts.
/// Tags of other elements go and their content stays, unless a reader sees nothing of it.
///
/// URLs become absolute. Names and classes get the prefix "tarnwick-rss-", so that they meet
/// neither the page's nor its styles; links within the content follow. A frame becomes a link to
/// what it would show, and the values in fields and on buttons become text.
///
/// The result is well-formed XML and is read as the same by HTML's rules: every "<", ">" and "&"
/// in texts and attributes is escaped, attributes are quoted, and no element is written whose
/// content HTML reads in another way. A second pass changes nothing.
struct SafeMarkup {
    static constexpr const char* kPrefix = "tarnwick-rss-";

    /// `markup` is what Tidy made, in UTF-8; `base`, which may be null, what its relative URLs
    /// count from. Markup that is not well-formed is read as HTML.
    static std::string make(const std::string& markup, Foundation::URL* base);
};

}  // namespace Orvane::FeedParser
