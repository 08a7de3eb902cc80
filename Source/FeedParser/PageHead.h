#pragma once

#include "Foundation/Uncopyable.h"

#include <cstddef>

#include <string>
#include <string_view>

namespace Orvane::FeedParser {

struct MarkupToken;

/// What is wanted of a web page: the links and bases of its head, as a small page of its own.
///
/// A page that is repaired as a whole loses links, since a repair ends the head at the first
/// element that does not belong there, and everything behind it becomes the body. So all links
/// count up to the end of the head or the beginning of the body, as they are written, wherever they
/// stand.
class PageHead : Foundation::Uncopyable {
 public:
    /// `page` is HTML in UTF-8, however broken.
    explicit PageHead(std::string_view page);

    /// The page, which is XHTML. Line feeds and tabs in attributes are marked by characters of
    /// their own, since whoever repairs the page takes them for blanks.
    const std::string& getPage() const { return mPage; }
    /// What a repair made of the page, with references for what was marked.
    std::string restore(std::string repaired) const;

 private:
    void scan(std::string_view page);
    void copy(const MarkupToken& token, std::string_view name);
    void copyValue(std::string_view value);
    std::size_t copyReference(std::string_view text);

    std::string mPage;
    std::string mLine;  ///< stands for a line feed
    std::string mTab;   ///< stands for a tab
};

}  // namespace Orvane::FeedParser
