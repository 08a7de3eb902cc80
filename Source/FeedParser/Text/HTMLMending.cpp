#include "FeedParser/Text/HTMLMending.h"

#include "FeedParser/Text/Bounds.h"
#include "FeedParser/Text/HTMLElements.h"
#include "FeedParser/Text/MarkupScanner.h"
#include "FeedParser/Text/XMLCharacters.h"

#include <algorithm>
#include <iterator>
#include <utility>

namespace Orvane::FeedParser {

namespace {

bool isForeignRoot(std::string_view name) {
    return name == "svg" || name == "math";
}

/// The elements of SVG and MathML that hold HTML (HTML, "integration points").
constexpr std::string_view kHolders[] = {
    "annotation-xml", "desc", "foreignobject", "mi", "mn", "mo", "ms", "mtext", "title"};
/// What ends a drawing or formula that was not closed (HTML, "in foreign content").
constexpr std::string_view kBreakouts[] = {
    "b",      "big",  "blockquote", "body",  "br",   "center", "code",    "dd",   "div",
    "dl",     "dt",   "em",         "embed", "h1",   "h2",     "h3",      "h4",   "h5",
    "h6",     "head", "hr",         "i",     "img",  "li",     "listing", "menu", "meta",
    "nobr",   "ol",   "p",          "pre",   "ruby", "s",      "small",   "span", "strike",
    "strong", "sub",  "sup",        "table", "tt",   "u",      "ul",      "var"};

template <std::size_t N>
bool isOneOf(const std::string_view (&list)[N], std::string_view name) {
    return std::find(std::begin(list), std::end(list), name) != std::end(list);
}

}  // namespace

HTMLMending::HTMLMending(Kind kind) : mKind(kind) {}
HTMLMending::~HTMLMending() = default;

std::string HTMLMending::mend(std::string_view markup) {
    mOut.reserve(markup.size() + 64);
    MarkupScanner scanner(markup, MarkupScanner::Language::HTML);
    MarkupToken token;
    while (scanner.next(token)) {
        handle(token);
        if (mRawText.empty()) continue;
        const std::string_view text = scanner.skipRawText(mRawText);
        if (!isLeftOut(mRawText)) mOut += text;
        mRawText.clear();
    }
    XMLCharacters::scrub(mOut);
    return std::move(mOut);
}

void HTMLMending::handle(const MarkupToken& token) {
    switch (token.kind) {
        case MarkupToken::Kind::StartTag:
            return handleStart(token);
        case MarkupToken::Kind::EndTag:
            return handleEnd(token);
        case MarkupToken::Kind::Text:
            return copyText(token.whole);
        case MarkupToken::Kind::CharacterData:
            mOut += token.whole;
            return;
        case MarkupToken::Kind::Declaration:
            if (XMLCharacters::toLower(token.content).starts_with("doctype")) mOut += token.whole;
            return;
        case MarkupToken::Kind::Comment:
        case MarkupToken::Kind::Instruction:
            return;
    }
}

bool HTMLMending::isLeftOut(std::string_view name) const {
    if (mKind != Kind::Snippet || isForeign()) return false;
    return name == "script" || name == "style" || name == "noscript";
}

const HTMLElement* HTMLMending::findKnown(const std::string& name) const {
    if (isLeftOut(name)) return nullptr;
    const HTMLElement* element = HTMLElement::find(name);
    return element && element->is(HTMLElement::Known) ? element : nullptr;
}

void HTMLMending::leaveForeign(const std::string& name) {
    if (mHTMLInForeign > 0 || !isOneOf(kBreakouts, name)) return;
    for (; !mForeignRoots.empty(); mForeignRoots.pop_back()) {
        const std::string& root = mForeignRoots.back();
        mOut += "</" + root + ">";
        --mCounts[root].open;
        --mDepth;
    }
}

void HTMLMending::handleStart(const MarkupToken& token) {
    const std::string name = XMLCharacters::toLower(token.name);
    leaveForeign(name);
    if (isLeftOut(name) && name != "noscript") mRawText = name;
    const HTMLElement* element = findKnown(name);
    if (!element && !isForeign()) return;
    static constexpr HTMLElement kForeign = {"", HTMLElement::Known};
    const HTMLElement& known = element ? *element : kForeign;
    const bool isOfForeign = isForeign() || isForeignRoot(name);
    if (known.is(HTMLElement::Empty) || (token.isEmpty && isOfForeign)) return copyTag(token);
    if (isBeyondBounds(known)) {
        ++mCounts[name].leftOut;
        return;
    }
    if (!known.is(HTMLElement::Inline)) limitRepeats();
    ++mCounts[name].open;
    if (!known.is(HTMLElement::ImpliedEnd)) ++mDepth;
    if (known.is(HTMLElement::Inline)) ++mInlines;
    if (isForeign() && isOneOf(kHolders, name)) ++mHTMLInForeign;
    if (isForeignRoot(name)) mForeignRoots.push_back(name);
    if (known.is(HTMLElement::RawText) && !isForeign()) mRawText = name;
    copyTag(token);
}

bool HTMLMending::isBeyondBounds(const HTMLElement& element) {
    if (mDepth >= Bounds::kElementDepth && !element.is(HTMLElement::ImpliedEnd)) {
        if (!mHitDepth) Bounds::logHit("kElementDepth", Bounds::kElementDepth);
        mHitDepth = true;
        return true;
    }
    if (mInlines >= Bounds::kOpenInlines && element.is(HTMLElement::Inline)) {
        if (!mHitInlines) Bounds::logHit("kOpenInlines", Bounds::kOpenInlines);
        mHitInlines = true;
        return true;
    }
    return false;
}

void HTMLMending::limitRepeats() {
    mRepeatedInlines += mInlines;
    if (mRepeatedInlines <= Bounds::kRepeatedInlines) return;
    if (!mHitRepeats) Bounds::logHit("kRepeatedInlines", Bounds::kRepeatedInlines);
    mHitRepeats = true;
    for (auto& [name, count] : mCounts) {
        const HTMLElement* element = findKnown(name);
        if (!element || !element->is(HTMLElement::Inline)) continue;
        for (; count.open > 0; --count.open) {
            mOut += "</" + name + ">";
            ++count.leftOut;
            --mDepth;
        }
    }
    mInlines = 0;
}

void HTMLMending::handleEnd(const MarkupToken& token) {
    const std::string name = XMLCharacters::toLower(token.name);
    const HTMLElement* element = findKnown(name);
    if (!element && !isForeign()) return;
    Count& count = mCounts[name];
    if (count.leftOut > 0) {
        --count.leftOut;
        return;
    }
    if (count.open > 0) {
        --count.open;
        if (!element || !element->is(HTMLElement::ImpliedEnd)) --mDepth;
        if (element && element->is(HTMLElement::Inline)) --mInlines;
        if (mHTMLInForeign > 0 && isOneOf(kHolders, name)) --mHTMLInForeign;
        const auto root = std::find(mForeignRoots.rbegin(), mForeignRoots.rend(), name);
        if (root != mForeignRoots.rend()) mForeignRoots.erase(root.base() - 1);
        if (!isForeign()) mHTMLInForeign = 0;
    }
    copyTag(token);
}

void HTMLMending::copyTag(const MarkupToken& token) {
    // Shorter than that it can't have too many attributes.
    if (token.content.size() > std::size_t{Bounds::kMendedAttributes}) return copyAttributes(token);
    copyWithReferences(token.whole);
    // A tag that the markup's end cut off.
    if (!token.whole.ends_with('>')) mOut += '>';
}

void HTMLMending::copyAttributes(const MarkupToken& token) {
    mOut += token.kind == MarkupToken::Kind::EndTag ? "</" : "<";
    mOut += token.name;
    AttributeScanner scanner(token.content);
    std::string_view name, value;
    for (int count = 0; scanner.next(name, value); ++count) {
        if (count == Bounds::kMendedAttributes) {
            Bounds::logHit("kMendedAttributes", Bounds::kMendedAttributes);
            break;
        }
        const char quote = value.find('"') == std::string_view::npos ? '"' : '\'';
        mOut += ' ';
        mOut += name;
        mOut += '=';
        mOut += quote;
        copyWithReferences(value);
        mOut += quote;
    }
    mOut += token.isEmpty ? " />" : ">";
}

void HTMLMending::copyText(std::string_view text) {
    for (const char c : text) {
        // It begins no tag, which Tidy finds out only behind the next character.
        if (c == '<') {
            mOut += "&lt;";
        } else {
            mOut += c;
        }
    }
}

void HTMLMending::copyWithReferences(std::string_view text) {
    for (std::size_t i = 0; i < text.size(); ++i) {
        mOut += text[i];
        if (text[i] != '&' || i + 1 >= text.size()) continue;
        if (!XMLCharacters::isLetter(text[i + 1])) continue;
        if (XMLCharacters::readReference(text.substr(i)).length == 0) mOut += "amp;";
    }
}

}  // namespace Orvane::FeedParser
