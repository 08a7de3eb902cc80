#include "FeedParser/Text/MarkupLook.h"

#include "FeedParser/Text/Bounds.h"
#include "FeedParser/Text/HTMLElements.h"
#include "FeedParser/Text/MarkupScanner.h"
#include "FeedParser/Text/XMLCharacters.h"

#include <algorithm>
#include <iterator>
#include <string>
#include <utility>
#include <vector>

namespace Orvane::FeedParser {

namespace {

/// Whether an element that begins so stays open until an end tag comes.
bool staysOpen(const MarkupToken& token) {
    if (token.isEmpty) return false;
    const HTMLElement* element = HTMLElement::find(XMLCharacters::toLower(token.name));
    return !element || !(element->is(HTMLElement::Empty) || element->is(HTMLElement::ImpliedEnd));
}

constexpr std::string_view kBlocks[] = {"blockquote", "dd", "div", "dl",  "dt", "h1",
                                        "h2",         "h3", "h4",  "h5",  "h6", "hr",
                                        "li",         "ol", "p",   "pre", "ul"};
constexpr std::string_view kInlines[] = {"a",      "abbr",   "b",   "br",  "cite", "code",  "em",
                                         "font",   "i",      "img", "q",   "s",    "small", "span",
                                         "strike", "strong", "sub", "sup", "tt",   "u"};

template <std::size_t N>
bool isOneOf(const std::string_view (&list)[N], std::string_view name) {
    return std::find(std::begin(list), std::end(list), name) != std::end(list);
}

/// The nesting of plain HTML, tag by tag.
class PlainNesting {
 public:
    bool begin(const MarkupToken& token) {
        std::string name = XMLCharacters::toLower(token.name);
        const bool isBlock = isOneOf(kBlocks, name);
        if (!isBlock && !isOneOf(kInlines, name)) return false;
        if (isBlock) endParagraph();
        if (isBlock && !mOpen.empty() && !mayHoldBlocks(mOpen.back())) return false;
        if (!fits(name)) return false;
        if (name != "br" && name != "hr" && name != "img") {
            // What is written as empty and is not stays open for HTML.
            if (token.isEmpty) return false;
            mOpen.push_back(std::move(name));
        }
        return true;
    }

    bool end(const MarkupToken& token) {
        const std::string name = XMLCharacters::toLower(token.name);
        if (name != "p") endParagraph();
        if (mOpen.empty() || mOpen.back() != name) return false;
        mOpen.pop_back();
        return true;
    }

    bool isWhole() {
        endParagraph();
        return mOpen.empty();
    }

 private:
    static bool mayHoldBlocks(const std::string& name) {
        return name == "blockquote" || name == "dd" || name == "div" || name == "li" ||
               name == "ul" || name == "ol" || name == "dl";
    }
    /// Whether an element of a list is in one, and nothing else is.
    bool fits(const std::string& name) const {
        const std::string_view parent =
            mOpen.empty() ? std::string_view() : std::string_view(mOpen.back());
        const bool isInList = parent == "ul" || parent == "ol";
        if (name == "li") return isInList;
        if (name == "dt" || name == "dd") return parent == "dl";
        // A link in a link would be moved out of it.
        if (name == "a" && std::find(mOpen.begin(), mOpen.end(), "a") != mOpen.end()) return false;
        return !isInList && parent != "dl";
    }
    void endParagraph() {
        if (!mOpen.empty() && mOpen.back() == "p") mOpen.pop_back();
    }

    std::vector<std::string> mOpen;
};

}  // namespace

bool MarkupLook::isPlainHTML(std::string_view markup) {
    MarkupScanner scanner(markup, MarkupScanner::Language::HTML);
    MarkupToken token;
    PlainNesting nesting;
    while (scanner.next(token)) {
        switch (token.kind) {
            case MarkupToken::Kind::Text:
            case MarkupToken::Kind::Comment:
                break;
            case MarkupToken::Kind::StartTag:
                if (!nesting.begin(token)) return false;
                break;
            case MarkupToken::Kind::EndTag:
                if (!nesting.end(token)) return false;
                break;
            default:
                return false;
        }
    }
    return nesting.isWhole();
}

bool MarkupLook::isSmallAndShallow(std::string_view markup) {
    if (markup.size() > Bounds::kInPlaceBytes) return false;
    // What has zeros may be of two bytes a character, of which a look at bytes sees nothing.
    if (markup.find('\0') != std::string_view::npos) return false;
    MarkupScanner scanner(markup, MarkupScanner::Language::HTML);
    MarkupToken token;
    int depth = 0;
    while (scanner.next(token)) {
        if (token.kind == MarkupToken::Kind::StartTag && staysOpen(token)) ++depth;
        if (token.kind == MarkupToken::Kind::EndTag) depth = std::max(depth - 1, 0);
        if (depth > Bounds::kInPlaceDepth) return false;
    }
    return true;
}

bool MarkupLook::isPage(std::string_view markup) {
    MarkupScanner scanner(markup, MarkupScanner::Language::XML);
    MarkupToken token;
    while (scanner.next(token)) {
        if (token.kind != MarkupToken::Kind::StartTag) continue;
        std::string_view name = token.name;
        name.remove_prefix(name.find(':') + 1);
        const HTMLElement* element = HTMLElement::find(XMLCharacters::toLower(name));
        return element && element->is(HTMLElement::Known);
    }
    return false;
}

}  // namespace Orvane::FeedParser
