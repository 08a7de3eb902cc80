#include "Net/WWWAuthenticate.h"

#include "Net/HTTPMessage.h"

#include <algorithm>

namespace Orvane {

namespace {

constexpr std::string_view kBlanks = " \t";

std::string_view trimmed(std::string_view text) {
    const std::size_t begin = text.find_first_not_of(kBlanks);
    if (begin == std::string_view::npos) return {};
    return text.substr(begin, text.find_last_not_of(kBlanks) - begin + 1);
}

/// The place of the first `mark` outside of a quoted string; the end if there is none.
std::size_t findUnquoted(std::string_view text, char mark) {
    bool isQuoted = false;
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (isQuoted && text[i] == '\\') {
            ++i;
        } else if (text[i] == '"') {
            isQuoted = !isQuoted;
        } else if (!isQuoted && text[i] == mark) {
            return i;
        }
    }
    return text.size();
}

std::string unquoted(std::string_view text) {
    if (text.size() < 2 || text.front() != '"' || text.back() != '"') return std::string(text);
    std::string result;
    for (std::size_t i = 1; i + 1 < text.size(); ++i) {
        if (text[i] == '\\' && i + 2 < text.size()) ++i;
        result += text[i];
    }
    return result;
}

}  // namespace

std::string WWWAuthenticate::Challenge::getParameter(std::string_view name) const {
    for (const auto& [key, value] : parameters) {
        if (HTTPMessage::isSameName(key, name)) return value;
    }
    return {};
}

WWWAuthenticate::WWWAuthenticate(std::string_view value) {
    while (!value.empty()) {
        const std::size_t end = findUnquoted(value, ',');
        readElement(trimmed(value.substr(0, end)));
        value.remove_prefix(std::min(end + 1, value.size()));
    }
}

/// An element of the list is a parameter of the last scheme, or a new scheme with or without its
/// first parameter: only what stands before the "=" tells.
void WWWAuthenticate::readElement(std::string_view element) {
    if (element.empty()) return;
    const std::size_t equals = findUnquoted(element, '=');
    std::string_view name = trimmed(element.substr(0, equals));
    const std::size_t blank = name.find_first_of(kBlanks);
    const bool hasValue = equals < element.size();
    if (name.find('"') != std::string_view::npos) return;
    if (blank != std::string_view::npos || !hasValue) {
        mChallenges.push_back({std::string(name.substr(0, blank)), {}});
        if (blank == std::string_view::npos) return;
        name = trimmed(name.substr(blank));
    }
    if (!hasValue || mChallenges.empty()) return;
    mChallenges.back().parameters.emplace_back(name, unquoted(trimmed(element.substr(equals + 1))));
}

const WWWAuthenticate::Challenge* WWWAuthenticate::find(std::string_view scheme) const {
    for (const Challenge& challenge : mChallenges) {
        if (HTTPMessage::isSameName(challenge.scheme, scheme)) return &challenge;
    }
    return nullptr;
}

}  // namespace Orvane
