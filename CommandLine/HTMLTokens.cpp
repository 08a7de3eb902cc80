#include "HTMLTokens.h"

#include <Orvane/OVXMLElement.h>
#include <glib.h>

#include <cctype>
#include <cstdlib>
#include <utility>

namespace Commands {

namespace {

std::string lowerCase(std::string_view text) {
    std::string result(text);
    for (char& c : result) {
        c = g_ascii_tolower(c);
    }
    return result;
}

bool isNameCharacter(char c) {
    return g_ascii_isalnum(c) || c == ':' || c == '-' || c == '_';
}

std::string utf8(unsigned long code) {
    constexpr gunichar kReplacement = 0xFFFD;
    const bool isValid = code != 0 && g_unichar_validate(static_cast<gunichar>(code));
    char text[8] = {};
    g_unichar_to_utf8(isValid ? static_cast<gunichar>(code) : kReplacement, text);
    return text;
}

/// What a reference stands for, by what is between "&" and ";"; empty if it stands for nothing.
std::string meaningOf(const std::string& reference) {
    if (reference.size() > 1 && reference[0] == '#') {
        const bool isHexadecimal = g_ascii_tolower(reference[1]) == 'x';
        const char* digits = reference.c_str() + (isHexadecimal ? 2 : 1);
        char* end = nullptr;
        const unsigned long code = std::strtoul(digits, &end, isHexadecimal ? 16 : 10);
        return end != digits && *end == 0 ? utf8(code) : std::string();
    }
    const std::pair<const char*, const char*> kCommon[] = {
        {"amp", "&"}, {"lt", "<"}, {"gt", ">"}, {"quot", "\""}, {"apos", "'"}, {"nbsp", "\u00A0"}};
    for (const auto& [name, text] : kCommon) {
        if (reference == name) return text;
    }
    // The library knows the rest.
    const auto parsed = OVXMLElement::parse("<p>&" + reference + ";</p>", true);
    const std::string text = parsed ? parsed->stringValue() : std::string();
    return text.find(reference) == std::string::npos ? text : std::string();
}

}  // namespace

std::string HTMLTokens::resolved(std::string_view text) {
    constexpr std::size_t kLongest = 32;
    std::string result;
    for (std::size_t i = 0; i < text.size(); ++i) {
        const std::size_t end = text[i] == '&' ? text.find(';', i) : std::string_view::npos;
        std::string meaning;
        if (end != std::string_view::npos && end - i < kLongest) {
            const std::string reference(text.substr(i + 1, end - i - 1));
            const bool isName = reference.find_first_of(" &<\n") == std::string::npos;
            if (isName) meaning = meaningOf(reference);
        }
        if (meaning.empty()) {
            result += text[i];
        } else {
            result += meaning;
            i = end;
        }
    }
    return result;
}

HTMLTokens::Kind HTMLTokens::next() {
    while (mAt < mHTML.size()) {
        if (mHTML.substr(mAt).starts_with("<!--")) {
            const std::size_t end = mHTML.find("-->", mAt);
            mAt = end == std::string_view::npos ? mHTML.size() : end + 3;
            continue;
        }
        const bool isTag = mHTML[mAt] == '<' && mAt + 1 < mHTML.size() &&
                           (g_ascii_isalpha(mHTML[mAt + 1]) || mHTML[mAt + 1] == '/' ||
                            mHTML[mAt + 1] == '!' || mHTML[mAt + 1] == '?');
        if (isTag) return readTag();
        const std::size_t end = std::min(mHTML.find('<', mAt + 1), mHTML.size());
        mText = resolved(mHTML.substr(mAt, end - mAt));
        mAt = end;
        return Kind::Text;
    }
    return Kind::End;
}

HTMLTokens::Kind HTMLTokens::readTag() {
    const std::size_t start = mAt + 1;
    char quote = 0;
    for (++mAt; mAt < mHTML.size() && (quote || mHTML[mAt] != '>'); ++mAt) {
        if (quote) {
            if (mHTML[mAt] == quote) quote = 0;
        } else if ((mHTML[mAt] == '"' || mHTML[mAt] == '\'') && mHTML[mAt - 1] == '=') {
            quote = mHTML[mAt];
        }
    }
    std::string_view tag = mHTML.substr(start, mAt - start);
    mAt = std::min(mAt + 1, mHTML.size());
    const bool isEnd = tag.starts_with('/');
    if (isEnd) tag.remove_prefix(1);
    std::size_t length = 0;
    while (length < tag.size() && isNameCharacter(tag[length])) {
        ++length;
    }
    mName = lowerCase(tag.substr(0, length));
    readAttributes(tag.substr(length));
    return isEnd ? Kind::Close : Kind::Open;
}

void HTMLTokens::readAttributes(std::string_view text) {
    mAttributes.clear();
    for (std::size_t i = 0; i < text.size();) {
        const std::size_t start = i;
        while (i < text.size() && isNameCharacter(text[i])) {
            ++i;
        }
        const std::string name = lowerCase(text.substr(start, i - start));
        if (name.empty()) {
            ++i;
            continue;
        }
        std::string_view value;
        if (i < text.size() && text[i] == '=') {
            const char quote = i + 1 < text.size() ? text[i + 1] : ' ';
            const bool isQuoted = quote == '"' || quote == '\'';
            const std::size_t from = i + (isQuoted ? 2 : 1);
            const std::size_t end = std::min(
                isQuoted ? text.find(quote, from) : text.find_first_of(" \t\n", from), text.size());
            value = text.substr(std::min(from, end), end - std::min(from, end));
            i = end + (isQuoted ? 1 : 0);
        }
        mAttributes.emplace(name, resolved(value));
    }
}

void HTMLTokens::skipTo(std::string_view name) {
    for (std::size_t at = mAt; (at = mHTML.find("</", at)) != std::string_view::npos; ++at) {
        if (lowerCase(mHTML.substr(at + 2, name.size())) == name) {
            mAt = at;
            return;
        }
    }
    mAt = mHTML.size();
}

std::string HTMLTokens::attribute(const std::string& name) const {
    const auto found = mAttributes.find(name);
    return found == mAttributes.end() ? std::string() : found->second;
}

}  // namespace Commands
