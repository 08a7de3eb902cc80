#include "FeedParser/Text/XMLMending.h"

#include "FeedParser/Text/Blanks.h"
#include "FeedParser/Text/Bounds.h"
#include "FeedParser/Text/MarkupScanner.h"
#include "FeedParser/Text/XMLCharacters.h"

#include <algorithm>
#include <iterator>

namespace Orvane::FeedParser {

namespace {

constexpr auto npos = std::string_view::npos;
constexpr std::string_view kNoBreakSpace = "\xC2\xA0";
constexpr std::string_view kNoBreakSpaceReferences[] = {"&#160;", "&#XA0;", "&#Xa0;",
                                                        "&#xA0;", "&#xa0;", "&nbsp;"};
constexpr std::string_view kPreserve = " xml:space=\"preserve\"";
constexpr std::string_view kXMLNamespaces[] = {"http://www.w3.org/XML/1998/namespace",
                                               "http://www.w3.org/2000/xmlns/"};

/// Characters for private use, of which no text is likely to use many.
constexpr const char* kMarks[] = {"\xEF\xA3\xBE", "\xEF\xA3\xBD", "\xEF\xA3\xBC",
                                  "\xEF\xA3\xBB", "\xEF\xA3\xBA", "\xEF\xA3\xB9"};

/// Elements of HTML that have no content, and come without an end in feeds that forgot to escape.
constexpr std::string_view kEmpty[] = {"area", "br",    "col",   "embed", "hr",
                                       "img",  "input", "param", "wbr"};
/// What ends where the next of its kind begins.
constexpr std::string_view kEndedByNext[] = {"dd", "dt", "li", "option", "p", "td", "th", "tr"};
/// What ends there even if something else is still open in it.
constexpr std::string_view kEntries[] = {"entry", "item"};

constexpr std::string_view kMadeUp = "urn:x-orvane:prefix:";

struct Known {
    std::string_view prefix;
    const char* uri;
};

constexpr Known kKnown[] = {
    {"atom", "http://www.w3.org/2005/Atom"},
    {"content", "http://purl.org/rss/1.0/modules/content/"},
    {"dc", "http://purl.org/dc/elements/1.1/"},
    {"foaf", "http://xmlns.com/foaf/0.1/"},
    {"rdf", "http://www.w3.org/1999/02/22-rdf-syntax-ns#"},
    {"xhtml", "http://www.w3.org/1999/xhtml"},
};

template <std::size_t N>
bool isOneOf(const std::string_view (&list)[N], std::string_view name) {
    return std::find(std::begin(list), std::end(list), name) != std::end(list);
}

bool isNameStart(char c) {
    return XMLCharacters::isLetter(c) || c == '_';
}

bool isNameCharacter(char c) {
    return isNameStart(c) || XMLCharacters::isDigit(c) || c == '.' || c == '-';
}

/// A name that is one of XML with namespaces, made of what was meant as one; empty if that has no
/// usable character.
std::string cleanName(std::string_view name) {
    std::string clean;
    bool hasColon = false;
    for (const char c : name) {
        const bool mayBegin = clean.empty() || clean.back() == ':';
        if (c == ':' && !hasColon && !clean.empty()) {
            hasColon = true;
            clean += c;
        } else if (mayBegin ? isNameStart(c) : isNameCharacter(c)) {
            clean += c;
        } else if (!clean.empty() || static_cast<unsigned char>(c) >= 0x80) {
            clean += '_';
        }
    }
    while (clean.ends_with(':'))
        clean.pop_back();
    return clean;
}

std::string_view prefixOf(std::string_view name) {
    const std::size_t colon = name.find(':');
    return colon == npos ? std::string_view() : name.substr(0, colon);
}

bool isURICharacter(char c) {
    return XMLCharacters::isLetter(c) || XMLCharacters::isDigit(c) ||
           std::string_view("-._~:/?#@!$&'()*+,;=%").find(c) != npos;
}

}  // namespace

XMLMending::XMLMending(Kind kind, bool isUTF8) : mKind(kind), mIsUTF8(isUTF8) {}
XMLMending::~XMLMending() = default;

std::string XMLMending::getNamespace(std::string_view prefix) {
    const std::string lower = XMLCharacters::toLower(prefix);
    for (const Known& known : kKnown) {
        if (known.prefix == lower) return known.uri;
    }
    return std::string(kMadeUp).append(prefix);
}

bool XMLMending::isMadeUpNamespace(std::string_view uri) {
    return uri.starts_with(kMadeUp);
}

std::string XMLMending::mend(std::string_view markup) {
    chooseMarks(markup);
    mOut.reserve(markup.size() + markup.size() / 8 + 256);
    if (mKind == Kind::Snippet) beginSnippet();
    MarkupScanner scanner(markup, MarkupScanner::Language::XML);
    MarkupToken token;
    while (!mIsDone && scanner.next(token))
        handle(token);
    finish();
    return std::move(mOut);
}

void XMLMending::chooseMarks(std::string_view markup) {
    std::vector<std::string> free;
    for (const char* mark : kMarks) {
        if (markup.find(mark) == npos) free.emplace_back(mark);
    }
    // Without marks of their own they can't be told from what Tidy makes.
    const bool hasMarks = free.size() >= 2;
    mLine = hasMarks ? free[0] : "\n";
    mSpace = hasMarks ? free[1] : std::string(kNoBreakSpace);
}

void XMLMending::beginSnippet() {
    // Not counted among the open elements, so that no end tag of the content's ends it.
    mOpen.push_back({std::string(kSnippetRoot), 0, false});
    ++mDepth;
    mOut += '<';
    mOut += kSnippetRoot;
    mRootNameEnd = mOut.size();
    mOut += '>';
}

void XMLMending::handle(const MarkupToken& token) {
    switch (token.kind) {
        case MarkupToken::Kind::Text:
            return handleText(token.whole);
        case MarkupToken::Kind::StartTag:
            return handleStart(token);
        case MarkupToken::Kind::EndTag:
            return handleEnd(token.name);
        case MarkupToken::Kind::CharacterData:
            return handleData(token.content);
        case MarkupToken::Kind::Instruction:
            return handleInstruction(token.whole);
        case MarkupToken::Kind::Declaration:
            return readEntities(token.content);
        case MarkupToken::Kind::Comment:
            return;
    }
}

void XMLMending::handleInstruction(std::string_view whole) {
    if (mKind != Kind::Feed || mRootNameEnd != 0 || !mOut.empty()) return;
    if (!whole.starts_with("<?xml") || whole.size() < 6 || !isBlank(whole[5])) return;
    mOut = mIsUTF8 ? "<?xml version=\"1.0\" encoding=\"UTF-8\"?>" : std::string(whole);
    mOut += '\n';
}

void XMLMending::handleText(std::string_view text) {
    if (!mOpen.empty()) writeText(text, true, '\0');
}

void XMLMending::handleData(std::string_view text) {
    if (!mOpen.empty()) writeText(text, false, '\0');
}

void XMLMending::writeText(std::string_view text, bool keepReferences, char quote) {
    for (std::size_t i = 0; i < text.size(); ++i) {
        const char c = text[i];
        if (c == '<') {
            mOut += "&lt;";
        } else if (c == '>') {
            mOut += "&gt;";
        } else if (c == '"' && quote) {
            mOut += "&quot;";
        } else if (c == '&') {
            i += writeReference(text.substr(i), keepReferences) - 1;
        } else if (text.substr(i).starts_with(kNoBreakSpace)) {
            mOut += mSpace;
            ++i;
        } else if (c == '\n' || c == '\r') {
            if (c == '\r' && i + 1 < text.size() && text[i + 1] == '\n') continue;
            mOut += quote ? std::string_view(" ") : std::string_view(mLine);
        } else {
            mOut += c;
        }
    }
}

std::size_t XMLMending::writeReference(std::string_view text, bool keepReferences) {
    const XMLCharacters::Reference reference = XMLCharacters::readReference(text);
    if (!keepReferences || reference.length == 0) {
        mOut += "&amp;";
        return 1;
    }
    const std::string_view whole = text.substr(0, reference.length);
    if (isOneOf(kNoBreakSpaceReferences, whole)) {
        mOut += mSpace;
    } else if (reference.isCharacter) {
        mOut += whole;
    }
    return reference.length;
}

void XMLMending::readEntities(std::string_view documentType) {
    constexpr std::size_t kMany = 100;
    constexpr std::size_t kLong = 256;
    if (mRootNameEnd != 0 || !documentType.starts_with("DOCTYPE")) return;
    constexpr std::string_view kBegin = "<!ENTITY";
    for (std::size_t i = documentType.find(kBegin); i != npos && mEntities.size() < kMany;
         i = documentType.find(kBegin, i)) {
        i += kBegin.size();
        AttributeScanner words(documentType.substr(i, documentType.find('>', i) - i));
        std::string_view name, value, ignored;
        if (!words.next(name, ignored) || !words.next(value, ignored) || value.size() < 2) continue;
        const bool isQuoted = value.front() == '"' || value.front() == '\'';
        if (!isQuoted || value.size() > kLong) continue;
        const std::size_t start = static_cast<std::size_t>(value.data() - documentType.data()) + 1;
        const std::size_t end = documentType.find(value.front(), start);
        if (end == npos || end - start > kLong) continue;
        const std::string_view text = documentType.substr(start, end - start);
        if (text.find_first_of("&%<") == npos) mEntities.emplace(name, text);
    }
}

std::string XMLMending::expand(std::string_view value) {
    constexpr std::size_t kMuch = 65536;
    std::string result(value);
    if (mEntities.empty()) return result;
    for (std::size_t i = result.find('&'); i != npos; i = result.find('&', i + 1)) {
        const std::size_t end = result.find(';', i);
        if (end == npos) break;
        const auto found = mEntities.find(std::string_view(result).substr(i + 1, end - i - 1));
        if (found == mEntities.end() || mExpanded > kMuch) continue;
        mExpanded += found->second.size();
        result.replace(i, end + 1 - i, found->second);
    }
    return result;
}

XMLMending::Attributes XMLMending::readAttributes(std::string_view text) {
    Attributes attributes;
    AttributeScanner scanner(text);
    std::string_view name, value;
    std::set<std::string, std::less<>> seen;
    for (int count = 0; scanner.next(name, value); ++count) {
        if (count == Bounds::kMendedAttributes) {
            Bounds::logHit("kMendedAttributes", Bounds::kMendedAttributes);
            break;
        }
        Attribute attribute{cleanName(name), expand(value)};
        const bool isNamespace = attribute.name == "xmlns" || prefixOf(attribute.name) == "xmlns";
        if (isNamespace) cleanNamespace(attribute.value);
        if (isWanted(attribute) && seen.insert(attribute.name).second) {
            attributes.push_back(std::move(attribute));
        }
    }
    return attributes;
}

void XMLMending::cleanNamespace(std::string& uri) const {
    std::string clean;
    constexpr char kHex[] = "0123456789ABCDEF";
    for (const char c : withoutOuterBlanks(uri)) {
        if (isURICharacter(c)) {
            clean += c;
        } else {
            clean += {'%', kHex[(c >> 4) & 15], kHex[c & 15]};
        }
    }
    uri = std::move(clean);
}

bool XMLMending::isWanted(const Attribute& attribute) const {
    const std::string& name = attribute.name;
    if (name.empty() || name == "xml:space") return false;
    if (name == "xmlns") return !isOneOf(kXMLNamespaces, attribute.value);
    if (prefixOf(name) != "xmlns") return true;
    if (name == "xmlns:xml" || name == "xmlns:xmlns") return false;
    return !attribute.value.empty() && !isOneOf(kXMLNamespaces, attribute.value);
}

void XMLMending::declare(const Attributes& attributes) {
    for (const Attribute& attribute : attributes) {
        if (prefixOf(attribute.name) == "xmlns") mPrefixes.push_back(attribute.name.substr(6));
    }
}

void XMLMending::usePrefixOf(std::string_view name, bool isElement) {
    const std::string_view prefix = prefixOf(name);
    if (prefix.empty() || prefix == "xml" || (!isElement && prefix == "xmlns")) return;
    if (std::find(mPrefixes.begin(), mPrefixes.end(), prefix) != mPrefixes.end()) return;
    mUndeclared.emplace(prefix);
}

void XMLMending::closeImplied(std::string_view name) {
    // The root is ended by its own end alone.
    if (mOpen.size() < 2) return;
    const std::string lower = XMLCharacters::toLower(name);
    const std::string top = XMLCharacters::toLower(mOpen.back().name);
    if (top == lower && isOneOf(kEndedByNext, lower)) closeTop();
    if (mKind != Kind::Feed || !isOneOf(kEntries, lower)) return;
    const bool isRoot = XMLCharacters::toLower(mOpen.front().name) == lower;
    if (mOpenCounts[lower] > (isRoot ? 1 : 0)) handleEnd(name);
}

void XMLMending::handleStart(const MarkupToken& token) {
    std::string name = cleanName(token.name);
    if (name.empty()) return;
    if (prefixOf(name) == "xmlns") name[5] = '_';
    closeImplied(name);
    const Attributes attributes = readAttributes(token.content);
    const std::size_t prefixes = mPrefixes.size();
    declare(attributes);
    usePrefixOf(name, true);
    for (const Attribute& attribute : attributes)
        usePrefixOf(attribute.name, false);

    const std::string lower = XMLCharacters::toLower(name);
    const bool isEmpty = token.isEmpty || (!mOpen.empty() && isOneOf(kEmpty, lower));
    const bool isDropped = mDepth >= Bounds::kElementDepth;
    if (isDropped && !mHitDepth) Bounds::logHit("kElementDepth", Bounds::kElementDepth);
    mHitDepth |= isDropped;
    if (!isDropped) writeStart(name, attributes, isEmpty);
    if (isEmpty) {
        mPrefixes.resize(prefixes);
        mIsDone = mOpen.empty();
        return;
    }
    ++mOpenCounts[lower];
    mDepth += isDropped ? 0 : 1;
    mOpen.push_back({std::move(name), prefixes, isDropped});
}

void XMLMending::writeStart(const std::string& name, const Attributes& attributes, bool isEmpty) {
    mOut += '<';
    mOut += name;
    if (mRootNameEnd == 0) mRootNameEnd = mOut.size();
    for (const Attribute& attribute : attributes) {
        mOut += ' ';
        mOut += attribute.name;
        mOut += "=\"";
        writeText(attribute.value, true, '"');
        mOut += '"';
    }
    mOut += isEmpty ? "/>" : ">";
}

void XMLMending::closeTop() {
    const Open& top = mOpen.back();
    if (!top.isDropped) {
        mOut += "</";
        mOut += top.name;
        mOut += '>';
        --mDepth;
    }
    mPrefixes.resize(top.prefixes);
    --mOpenCounts[XMLCharacters::toLower(top.name)];
    mOpen.pop_back();
    mIsDone = mOpen.empty();
}

void XMLMending::handleEnd(std::string_view tag) {
    const std::string name = XMLCharacters::toLower(cleanName(tag));
    const auto found = mOpenCounts.find(name);
    if (found == mOpenCounts.end() || found->second <= 0) return;
    while (XMLCharacters::toLower(mOpen.back().name) != name)
        closeTop();
    closeTop();
}

void XMLMending::finish() {
    while (!mOpen.empty())
        closeTop();
    std::string declarations;
    for (const std::string& prefix : mUndeclared)
        declarations += " xmlns:" + prefix + "=\"" + getNamespace(prefix) + "\"";
    if (mRootNameEnd != 0) mOut.insert(mRootNameEnd, std::string(kPreserve) + declarations);
    XMLCharacters::scrub(mOut);
}

std::string XMLMending::restore(const std::string& tidied) const {
    std::string result;
    result.reserve(tidied.size());
    const std::size_t root = tidied.starts_with("<?") ? tidied.find('\n') : npos;
    const std::size_t start = root == npos ? 0 : root + 1;
    result.append(tidied, 0, start);
    // Without a mark of its own a line can't be told from Tidy's.
    const bool hasMark = mLine != "\n";
    for (std::size_t i = start; i < tidied.size(); ++i) {
        if (hasMark && tidied[i] == '\n') continue;
        if (tidied.compare(i, mLine.size(), mLine) == 0) {
            result += '\n';
            i += mLine.size() - 1;
        } else if (tidied.compare(i, mSpace.size(), mSpace) == 0) {
            result += "&#160;";
            i += mSpace.size() - 1;
        } else {
            result += tidied[i];
        }
    }
    if (!result.ends_with('\n')) result += '\n';
    const std::size_t preserve = result.find(kPreserve);
    if (preserve != npos) result.erase(preserve, kPreserve.size());
    XMLCharacters::scrub(result);
    return result;
}

}  // namespace Orvane::FeedParser
