#include "FeedParser/PageHead.h"

#include "FeedParser/Text/CharacterEntities.h"
#include "FeedParser/Text/MarkupScanner.h"
#include "FeedParser/Text/XMLCharacters.h"

#include <algorithm>
#include <iterator>
#include <set>
#include <vector>

namespace Orvane::FeedParser {

namespace {

constexpr auto npos = std::string_view::npos;

/// Characters for private use, of which no page has many.
constexpr const char* kMarks[] = {"\xEF\xA3\xBE", "\xEF\xA3\xBD", "\xEF\xA3\xBC",
                                  "\xEF\xA3\xBB", "\xEF\xA3\xBA", "\xEF\xA3\xB9"};
/// Elements whose text has no markup (HTML, "raw text" and "escapable raw text").
constexpr std::string_view kRawText[] = {"iframe", "noembed",  "noframes", "script",
                                         "style",  "textarea", "title",    "xmp"};
/// The attributes of a link or a base that anybody looks at.
constexpr std::string_view kWanted[] = {"href", "rel", "title", "type"};

template <std::size_t N>
bool isOneOf(const std::string_view (&list)[N], std::string_view name) {
    return std::find(std::begin(list), std::end(list), name) != std::end(list);
}

void replaceAll(std::string& text, const std::string& what, std::string_view with) {
    for (std::size_t at = text.find(what); at != npos; at = text.find(what, at + with.size())) {
        text.replace(at, what.size(), with);
    }
}

}  // namespace

PageHead::PageHead(std::string_view page) {
    std::vector<const char*> marks;
    std::copy_if(std::begin(kMarks), std::end(kMarks), std::back_inserter(marks),
                 [&](const char* mark) { return page.find(mark) == npos; });
    mLine = marks.size() < 2 ? " " : marks[0];
    mTab = marks.size() < 2 ? " " : marks[1];
    mPage = "<!DOCTYPE html>\n<html><head><title></title>";
    scan(page);
    mPage += "</head><body></body></html>\n";
    XMLCharacters::scrub(mPage);
}

std::string PageHead::restore(std::string repaired) const {
    if (mLine == " ") return repaired;
    replaceAll(repaired, mLine, "&#10;");
    replaceAll(repaired, mTab, "&#9;");
    return repaired;
}

void PageHead::scan(std::string_view page) {
    MarkupScanner scanner(page, MarkupScanner::Language::HTML);
    MarkupToken token;
    std::set<std::string> unclosed;
    while (scanner.next(token)) {
        const std::string name = XMLCharacters::toLower(token.name);
        if (token.kind == MarkupToken::Kind::EndTag && name == "head") return;
        if (token.kind != MarkupToken::Kind::StartTag) continue;
        if (name == "body") return;
        if (name == "link" || name == "base") copy(token, name);
        if (!isOneOf(kRawText, name) || unclosed.count(name) > 0) continue;
        // Without an end, what follows is worth more than the text that it would be.
        const MarkupScanner behind = scanner;
        const std::string_view text = scanner.skipRawText(name);
        if (text.data() + text.size() < page.data() + page.size()) continue;
        scanner = behind;
        unclosed.insert(name);
    }
}

void PageHead::copy(const MarkupToken& token, std::string_view name) {
    (mPage += '<') += name;
    std::set<std::string> seen;
    AttributeScanner scanner(token.content);
    std::string_view attribute, value;
    while (scanner.next(attribute, value)) {
        const std::string lower = XMLCharacters::toLower(attribute);
        if (!isOneOf(kWanted, lower) || !seen.insert(lower).second) continue;
        ((mPage += ' ') += lower) += "=\"";
        copyValue(value);
        mPage += '"';
    }
    mPage += " />";
}

void PageHead::copyValue(std::string_view value) {
    for (std::size_t i = 0; i < value.size(); ++i) {
        switch (value[i]) {
            case '&':
                i += copyReference(value.substr(i)) - 1;
                break;
            case '<':
                mPage += "&lt;";
                break;
            case '"':
                mPage += "&quot;";
                break;
            case '\n':
                mPage += mLine;
                break;
            case '\t':
                mPage += mTab;
                break;
            case '\r':
                if (value.substr(i + 1, 1) != "\n") mPage += mLine;
                break;
            default:
                mPage += value[i];
                break;
        }
    }
}

/// For the "&" at the start of `text`. Gives how much of it that was.
std::size_t PageHead::copyReference(std::string_view text) {
    const XMLCharacters::Reference reference = XMLCharacters::readReference(text);
    const std::string_view whole = text.substr(0, reference.length);
    if (whole.starts_with("&#") && reference.isCharacter) {
        mPage += whole;
        return whole.size();
    }
    const char16_t character =
        whole.size() > 2 ? CharacterEntities::find(whole.substr(1, whole.size() - 2)) : u'\0';
    if (character == 0) {
        mPage += "&amp;";
        return 1;
    }
    (mPage += "&#") += std::to_string(static_cast<unsigned>(character));
    mPage += ';';
    return whole.size();
}

}  // namespace Orvane::FeedParser
