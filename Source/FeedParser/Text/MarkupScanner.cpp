#include "FeedParser/Text/MarkupScanner.h"

#include "FeedParser/Text/Blanks.h"
#include "FeedParser/Text/XMLCharacters.h"

#include <algorithm>

namespace Orvane::FeedParser {

namespace {

constexpr auto npos = std::string_view::npos;

bool isNameEnd(char c) {
    return isBlank(c) || c == '/' || c == '>' || c == '<';
}

bool equalsIgnoringCase(std::string_view a, std::string_view b) {
    return std::equal(a.begin(), a.end(), b.begin(), b.end(), [](char x, char y) {
        return XMLCharacters::toLower(x) == XMLCharacters::toLower(y);
    });
}

}  // namespace

bool MarkupScanner::next(MarkupToken& token) {
    if (mPosition >= mMarkup.size()) return false;
    token = MarkupToken();
    const std::string_view rest = mMarkup.substr(mPosition);
    if (!beginsMarkup(mPosition)) {
        readText(token);
    } else if (rest[1] == '?') {
        readInstruction(token);
    } else if (rest[1] == '!') {
        readDeclaration(token);
    } else {
        readTag(token);
    }
    mPosition += token.whole.size();
    return true;
}

bool MarkupScanner::beginsName(std::size_t position) const {
    if (position >= mMarkup.size()) return false;
    const char c = mMarkup[position];
    if (XMLCharacters::isLetter(c)) return true;
    return isXML() && (c == '_' || c == ':' || static_cast<unsigned char>(c) >= 0x80);
}

bool MarkupScanner::beginsMarkup(std::size_t position) const {
    if (mMarkup[position] != '<' || position + 1 >= mMarkup.size()) return false;
    const char c = mMarkup[position + 1];
    return c == '?' || c == '!' || beginsName(c == '/' ? position + 2 : position + 1);
}

std::size_t MarkupScanner::find(std::string_view what, std::size_t from, std::size_t& known) const {
    if (from >= known) return npos;
    const std::size_t found = mMarkup.find(what, from);
    if (found == npos) known = from;
    return found;
}

void MarkupScanner::readText(MarkupToken& token) {
    std::size_t end = mPosition;
    do {
        end = mMarkup.find('<', end + 1);
    } while (end != npos && !beginsMarkup(end));
    token.whole = mMarkup.substr(mPosition, end == npos ? npos : end - mPosition);
}

std::size_t MarkupScanner::findTagEnd(std::size_t from) {
    for (std::size_t i = from; i < mMarkup.size(); ++i) {
        const char c = mMarkup[i];
        if (c == '>' || (c == '<' && isXML())) return i;
        if (c != '=') continue;
        std::size_t start = i + 1;
        while (start < mMarkup.size() && isBlank(mMarkup[start]))
            ++start;
        if (start >= mMarkup.size()) break;
        const char quote = mMarkup[start];
        if (quote != '"' && quote != '\'') continue;
        const std::size_t end = find(std::string_view(&quote, 1), start + 1,
                                     quote == '"' ? mNone.quote : mNone.apostrophe);
        if (end != npos) i = end;
    }
    return mMarkup.size();
}

void MarkupScanner::readTag(MarkupToken& token) {
    const bool isEnd = mMarkup[mPosition + 1] == '/';
    const std::size_t start = mPosition + (isEnd ? 2 : 1);
    std::size_t nameEnd = start;
    while (nameEnd < mMarkup.size() && !isNameEnd(mMarkup[nameEnd]))
        ++nameEnd;
    const std::size_t end = findTagEnd(nameEnd);
    token.kind = isEnd ? MarkupToken::Kind::EndTag : MarkupToken::Kind::StartTag;
    token.name = mMarkup.substr(start, nameEnd - start);
    token.content = mMarkup.substr(nameEnd, end - nameEnd);
    token.isEmpty = !isEnd && token.content.ends_with('/');
    if (token.isEmpty) token.content.remove_suffix(1);
    const bool isClosed = end < mMarkup.size() && mMarkup[end] == '>';
    token.whole = mMarkup.substr(mPosition, end - mPosition + (isClosed ? 1 : 0));
}

void MarkupScanner::readDelimited(MarkupToken& token, MarkupToken::Kind kind,
                                  std::string_view begin, std::string_view end,
                                  std::size_t& known) {
    const std::size_t start = mPosition + begin.size();
    const std::size_t found = find(end, start, known);
    token.kind = kind;
    if (found != npos) {
        token.content = mMarkup.substr(start, found - start);
        token.whole = mMarkup.substr(mPosition, found + end.size() - mPosition);
    } else {
        // Its end is missing: what follows is worth more than what it was.
        token.whole = mMarkup.substr(mPosition, begin.size());
    }
}

void MarkupScanner::readInstruction(MarkupToken& token) {
    if (isXML()) {
        readDelimited(token, MarkupToken::Kind::Instruction, "<?", "?>", mNone.instructionEnd);
        if (token.whole.size() > 2) return;
    }
    readDelimited(token, MarkupToken::Kind::Instruction, "<?", ">", mNone.tagEnd);
}

void MarkupScanner::readDeclaration(MarkupToken& token) {
    const std::string_view rest = mMarkup.substr(mPosition);
    if (rest.starts_with("<!--")) {
        readDelimited(token, MarkupToken::Kind::Comment, "<!--", "-->", mNone.commentEnd);
    } else if (rest.starts_with("<![CDATA[")) {
        readDelimited(token, MarkupToken::Kind::CharacterData, "<![CDATA[", "]]>", mNone.dataEnd);
    } else {
        readDelimited(token, MarkupToken::Kind::Declaration, "<!", ">", mNone.tagEnd);
        // A document type may have declarations of its own in brackets.
        const std::size_t bracket = token.content.find('[');
        if (mSawDocumentType || !isXML() || bracket == npos) return;
        if (!token.content.starts_with("DOCTYPE")) return;
        mSawDocumentType = true;
        const std::size_t end = mMarkup.find(']', mPosition + bracket);
        const std::size_t close = end == npos ? npos : mMarkup.find('>', end);
        if (close == npos) return;
        token.content = mMarkup.substr(mPosition + 2, close - mPosition - 2);
        token.whole = mMarkup.substr(mPosition, close + 1 - mPosition);
    }
}

std::string_view MarkupScanner::skipRawText(std::string_view name) {
    const std::size_t start = mPosition;
    std::size_t end = start;
    for (;;) {
        end = mMarkup.find("</", end);
        if (end == npos) break;
        const std::string_view found = mMarkup.substr(end + 2, name.size());
        const std::size_t behind = end + 2 + name.size();
        const bool isWhole = behind >= mMarkup.size() || isNameEnd(mMarkup[behind]);
        if (isWhole && equalsIgnoringCase(found, name)) break;
        end += 2;
    }
    mPosition = end == npos ? mMarkup.size() : end;
    return mMarkup.substr(start, mPosition - start);
}

void AttributeScanner::skipBlanks() {
    while (!mRest.empty() && isBlank(mRest.front()))
        mRest.remove_prefix(1);
}

std::string_view AttributeScanner::take(std::size_t length) {
    const std::string_view taken = mRest.substr(0, length);
    mRest.remove_prefix(taken.size());
    return taken;
}

bool AttributeScanner::next(std::string_view& name, std::string_view& value) {
    while (!mRest.empty() && (isNameEnd(mRest.front()) || mRest.front() == '=')) {
        mRest.remove_prefix(1);
    }
    if (mRest.empty()) return false;
    name = take(mRest.find_first_of(" \t\r\n/=<>"));
    value = {};
    skipBlanks();
    if (mRest.empty() || mRest.front() != '=') return true;
    mRest.remove_prefix(1);
    skipBlanks();
    if (mRest.empty()) return true;
    const char quote = mRest.front();
    if (quote != '"' && quote != '\'') {
        value = take(mRest.find_first_of(" \t\r\n"));
        return true;
    }
    mRest.remove_prefix(1);
    value = take(mRest.find(quote));
    if (!mRest.empty()) mRest.remove_prefix(1);
    return true;
}

}  // namespace Orvane::FeedParser
