#include "FeedParser/DocumentGuard.h"

#include "FeedParser/Text/Blanks.h"
#include "FeedParser/Text/Bounds.h"
#include "FeedParser/Text/MarkupEncoding.h"
#include "Foundation/StringEncoding.h"

#include <algorithm>
#include <optional>
#include <utility>

namespace Orvane::FeedParser {

using Foundation::Data;
using Foundation::DataReturner;
using Foundation::Ref;
using Foundation::StringEncoding;

namespace {

constexpr auto npos = std::string_view::npos;

/// How many bytes an attribute takes at least: a="".
constexpr std::size_t kShortestAttribute = 4;

/// Where the text behind `what` begins; the end of the text if it is not there.
std::size_t behind(std::string_view text, std::string_view what, std::size_t from) {
    const std::size_t found = text.find(what, from);
    return found == npos ? text.size() : found + what.size();
}

bool begins(std::string_view text, std::size_t at, std::string_view what) {
    return text.substr(at, what.size()) == what;
}

/// Whether bytes below 128 may be something else than ASCII: two or four bytes to a character,
/// EBCDIC, or UTF-7.
bool mayHideASCII(std::string_view bytes) {
    const std::string_view start = bytes.substr(0, 4);
    if (start.find('\0') != npos || start.starts_with("\xFE\xFF") ||
        start.starts_with("\xFF\xFE")) {
        return true;
    }
    if (start == "\x4C\x6F\xA7\x94") return true;
    const std::string declared = MarkupEncoding::getDeclared(bytes);
    if (declared.empty()) return false;
    const std::optional<StringEncoding> encoding = StringEncoding::named(declared.c_str());
    constexpr std::string_view kProbe = "+ADw- &ADw- <!'\"[]>";
    return encoding && encoding->decode(kProbe) != kProbe;
}

/// The document in UTF-8. The declaration, which names another encoding, is blanked out.
std::string decoded(std::string_view bytes) {
    std::string text;
    if (bytes.starts_with("\x4C\x6F\xA7\x94")) {
        const std::optional<StringEncoding> ebcdic = StringEncoding::named("ibm-37");
        if (ebcdic) text = ebcdic->decodeLeniently(bytes);
    } else {
        text = MarkupEncoding::toUTF8(bytes, 0).bytes;
    }
    if (begins(text, 0, "<?xml")) text.erase(0, behind(text, "?>", 0));
    return text;
}

}  // namespace

DataReturner DocumentGuard::check(Data* data) {
    const std::string_view bytes = Data::asBytes(data).view();
    const bool isHidden = mayHideASCII(bytes);
    const std::string text = isHidden ? decoded(bytes) : std::string();
    DocumentGuard guard(isHidden ? std::string_view(text) : bytes);
    if (!guard.checkTags() || !guard.checkSubset()) return nullptr;
    if (guard.mMended.empty()) return DataReturner::retained(data);
    return Data::adopt(std::move(guard.mMended));
}

/// Counts tags, and looks into those that may have many attributes.
bool DocumentGuard::checkTags() {
    std::size_t at = mText.find('<');
    while (at != npos) {
        if (begins(mText, at, "<![CDATA[")) {
            at = mText.find('<', behind(mText, "]]>", at));
            continue;
        }
        if (++mTags > Bounds::kTags) {
            Bounds::logHit("tags", Bounds::kTags);
            return false;
        }
        // There is no "<" within a tag, so this is all that may belong to it.
        const std::size_t next = std::min(mText.find('<', at + 1), mText.size());
        if (next - at > Bounds::kAttributes * kShortestAttribute) checkAttributes(at, next);
        at = next < mText.size() ? next : npos;
    }
    return true;
}

void DocumentGuard::checkAttributes(std::size_t tag, std::size_t end) {
    if (tag + 1 < end && (mText[tag + 1] == '!' || mText[tag + 1] == '?')) return;
    const std::string_view text = mText.substr(0, end);
    std::size_t count = 0;
    for (std::size_t i = tag; i < end && text[i] != '>'; ++i) {
        if (text[i] == '=') ++count;
        if (text[i] == '"' || text[i] == '\'') i = std::min(text.find(text[i], i + 1), end);
        if (count <= Bounds::kAttributes) continue;
        Bounds::logHit("attributes", Bounds::kAttributes);
        // Blanks up to the end of the tag. The value that began here goes with the others' names.
        const std::size_t close = text.find_last_of('>');
        std::size_t begin = i;
        while (begin > tag && !isBlank(mText[begin - 1])) {
            --begin;
        }
        return cut(begin, close == npos || close < begin ? end : close);
    }
}

void DocumentGuard::cut(std::size_t begin, std::size_t end) {
    if (mMended.empty()) mMended = mText;
    std::fill(mMended.begin() + static_cast<std::ptrdiff_t>(begin),
              mMended.begin() + static_cast<std::ptrdiff_t>(end), ' ');
}

/// Looks at the declarations of the document type.
bool DocumentGuard::checkSubset() {
    const std::size_t begin = findSubset();
    if (begin == npos) return true;
    const std::size_t end = findSubsetEnd(begin);
    const std::string_view subset = mText.substr(begin, end - begin);
    const auto percents = static_cast<std::size_t>(std::count(subset.begin(), subset.end(), '%'));
    const char* bound = nullptr;
    if (subset.size() > Bounds::kSubsetBytes) bound = "bytes of declarations";
    if (percents > Bounds::kSubsetPercents) bound = "parameter entities";
    if (mAttributeDeclarationBytes * mTags > Bounds::kDefaultAttributeBytes) {
        bound = "default attributes";
    }
    if (!bound) return true;
    Bounds::logHit(bound, subset.size());
    cut(begin, end);
    return end < mText.size();
}

/// Where the "[" of the document type stands, if it has one.
std::size_t DocumentGuard::findSubset() {
    std::size_t at = begins(mText, 0, "\xEF\xBB\xBF") ? 3 : 0;
    while (at < mText.size()) {
        if (isBlank(mText[at])) {
            ++at;
        } else if (begins(mText, at, "<?")) {
            at = behind(mText, "?>", at);
        } else if (begins(mText, at, "<!--")) {
            at = behind(mText, "-->", at);
        } else if (begins(mText, at, "<!DOCTYPE")) {
            at = mText.find_first_of("[>\"'", at);
            while (at != npos && (mText[at] == '"' || mText[at] == '\'')) {
                at = mText.find_first_of(
                    "[>\"'", std::min(mText.find(mText[at], at + 1), mText.size() - 1) + 1);
            }
            return at != npos && mText[at] == '[' ? at : npos;
        } else {
            return npos;
        }
    }
    return npos;
}

/// The place behind the "]" that ends the declarations; the end of the text if there is none.
std::size_t DocumentGuard::findSubsetEnd(std::size_t from) {
    std::size_t at = from + 1;
    while (at < mText.size() && mText[at] != ']') {
        if (begins(mText, at, "<!--")) {
            at = behind(mText, "-->", at);
        } else if (begins(mText, at, "<?")) {
            at = behind(mText, "?>", at);
        } else if (begins(mText, at, "<!")) {
            const std::size_t end = skipDeclaration(at);
            if (begins(mText, at, "<!ATTLIST")) mAttributeDeclarationBytes += end - at;
            at = end;
        } else {
            ++at;
        }
    }
    return std::min(at + 1, mText.size());
}

std::size_t DocumentGuard::skipDeclaration(std::size_t from) const {
    std::size_t at = from;
    while (at < mText.size() && mText[at] != '>') {
        const char c = mText[at];
        if (c == '"' || c == '\'') at = std::min(mText.find(c, at + 1), mText.size() - 1);
        ++at;
    }
    return std::min(at + 1, mText.size());
}

}  // namespace Orvane::FeedParser
