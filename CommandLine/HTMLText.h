#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace Commands {

/// HTML as text for a terminal: paragraphs, lists and quotations in lines, and numbers where links
/// are.
class HTMLText {
 public:
    /// `base`, which may be empty, is what relative links count from. Never throws for bad HTML.
    HTMLText(std::string_view html, std::size_t columns, const std::string& base = {});

    /// Lines, each ended. What the document has can't control the terminal.
    const std::string& text() const { return mText; }
    /// Where links lead: that of "[1]" first.
    const std::vector<std::string>& links() const { return mLinks; }

 private:
    std::string mText;
    std::vector<std::string> mLinks;
};

}  // namespace Commands
