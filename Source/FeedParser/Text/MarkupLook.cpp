#include "FeedParser/Text/MarkupLook.h"

#include "FeedParser/Text/Bounds.h"
#include "FeedParser/Text/HTMLElements.h"
#include "FeedParser/Text/MarkupScanner.h"
#include "FeedParser/Text/XMLCharacters.h"

#include <algorithm>

namespace Orvane::FeedParser {

namespace {

/// Whether an element that begins so stays open until an end tag comes.
bool staysOpen(const MarkupToken& token) {
    if (token.isEmpty) return false;
    const HTMLElement* element = HTMLElement::find(XMLCharacters::toLower(token.name));
    return !element || !(element->is(HTMLElement::Empty) || element->is(HTMLElement::ImpliedEnd));
}

}  // namespace

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
