#include "Foundation/URLParts.h"

#include "Foundation/URLCharacters.h"

#include <arpa/inet.h>

#include <algorithm>

namespace Foundation {

namespace {

constexpr auto npos = std::string_view::npos;

/// Whether `text` holds escapes and characters that `isAllowed` accepts, and nothing else.
template <class Predicate>
bool consistsOf(std::string_view text, Predicate isAllowed) {
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (isURLEscape(text, i)) {
            i += 2;
        } else if (!isAllowed(text[i])) {
            return false;
        }
    }
    return true;
}

bool isNameCharacter(char c) {
    return isURLUnreserved(c) || isURLSubDelimiter(c);
}

bool isScheme(std::string_view text) {
    return !text.empty() && isURLAlpha(text.front()) && std::ranges::all_of(text, [](char c) {
        return isURLAlpha(c) || isURLDigit(c) || c == '+' || c == '-' || c == '.';
    });
}

/// "v1.anything", the form kept for addresses of the future.
bool isFutureAddress(std::string_view text) {
    const std::size_t dot = text.find('.');
    if (!text.starts_with('v') && !text.starts_with('V')) return false;
    if (dot == npos || dot < 2 || dot + 1 == text.size()) return false;
    return std::ranges::all_of(text.substr(1, dot - 1), isURLHexDigit) &&
           std::ranges::all_of(text.substr(dot + 1),
                               [](char c) { return isNameCharacter(c) || c == ':'; });
}

bool isHost(std::string_view text) {
    if (!text.starts_with('[')) return consistsOf(text, isNameCharacter);
    if (!text.ends_with(']')) return false;
    const std::string address(text.substr(1, text.size() - 2));
    in6_addr ignored = {};
    return isFutureAddress(address) || inet_pton(AF_INET6, address.c_str(), &ignored) == 1;
}

/// Takes all up to the first of `ends` off the front of `text`.
std::string_view takeUntil(std::string_view& text, const char* ends) {
    const std::string_view taken = text.substr(0, text.find_first_of(ends));
    text.remove_prefix(taken.size());
    return taken;
}

bool parseAuthority(std::string_view authority, URLParts& parts) {
    if (const std::size_t at = authority.find('@'); at != npos) {
        parts.user = authority.substr(0, at);
        authority.remove_prefix(at + 1);
        const auto isAllowed = [](char c) { return isNameCharacter(c) || c == ':'; };
        if (!consistsOf(*parts.user, isAllowed)) return false;
    }
    const std::size_t bracket = authority.rfind(']');
    const std::size_t colon = authority.find(':', bracket == npos ? 0 : bracket);
    if (colon != npos) {
        parts.port = authority.substr(colon + 1);
        if (!std::ranges::all_of(*parts.port, isURLDigit)) return false;
    }
    parts.host = authority.substr(0, colon);
    return isHost(*parts.host);
}

bool isPath(const URLParts& parts) {
    const auto isAllowed = [](char c) {
        return isURLPathCharacter(c) || c == '/' || isURLBracket(c);
    };
    if (!consistsOf(parts.path, isAllowed)) return false;
    // A colon in the first segment would read as the end of a scheme.
    if (parts.scheme || parts.host) return true;
    return parts.path.substr(0, parts.path.find('/')).find(':') == npos;
}

bool isQueryOrFragment(std::string_view text) {
    return consistsOf(text, [](char c) {
        return isURLPathCharacter(c) || c == '/' || c == '?' || isURLBracket(c);
    });
}

/// The path of a reference seen from `base` (section 5.2.3).
std::string mergePaths(const URLParts& base, std::string_view path) {
    if (base.host && base.path.empty()) return "/" + std::string(path);
    const std::size_t slash = base.path.rfind('/');
    return std::string(slash == npos ? std::string_view() : base.path.substr(0, slash + 1))
        .append(path);
}

/// The path of a reference with a path of its own, seen from `base`.
std::string resolvePath(const URLParts& base, const URLParts& reference) {
    const std::string path = reference.host || reference.path.starts_with('/')
                                 ? std::string(reference.path)
                                 : mergePaths(base, reference.path);
    if (path.empty() || path.starts_with('/')) return removeDotSegments(path);
    // Without a root, which the standard takes for granted: the result must not get one.
    const std::string rooted = removeDotSegments("/" + path);
    return rooted == "/" && !base.scheme ? "./" : rooted.substr(1);
}

/// Puts a URL together (section 5.3).
std::string compose(const URLParts& parts) {
    std::string text;
    if (parts.scheme) text.append(*parts.scheme) += ':';
    if (parts.host) {
        text += "//";
        if (parts.user) text.append(*parts.user) += '@';
        text += *parts.host;
        if (parts.port) (text += ':').append(*parts.port);
    } else if (parts.path.starts_with("//")) {
        text += "/.";  // what follows must not read as a host
    } else if (!isPath(parts)) {
        text += "./";  // nor this as a scheme
    }
    text += parts.path;
    if (parts.query) (text += '?').append(*parts.query);
    if (parts.fragment) (text += '#').append(*parts.fragment);
    return text;
}

}  // namespace

std::optional<URLParts> URLParts::parse(std::string_view text) {
    URLParts parts;
    const std::size_t mark = text.find_first_of(":/?#");
    if (mark != npos && text[mark] == ':') {
        parts.scheme = text.substr(0, mark);
        if (!isScheme(*parts.scheme)) return std::nullopt;
        text.remove_prefix(mark + 1);
    }
    if (text.starts_with("//")) {
        text.remove_prefix(2);
        if (!parseAuthority(takeUntil(text, "/?#"), parts)) return std::nullopt;
    }
    parts.path = takeUntil(text, "?#");
    if (!isPath(parts)) return std::nullopt;
    if (text.starts_with('?')) {
        text.remove_prefix(1);
        parts.query = takeUntil(text, "#");
        if (!isQueryOrFragment(*parts.query)) return std::nullopt;
    }
    if (text.starts_with('#')) {
        parts.fragment = text.substr(1);
        if (!isQueryOrFragment(*parts.fragment)) return std::nullopt;
    }
    return parts;
}

std::string resolveURL(const URLParts& base, const URLParts& reference) {
    if (reference.scheme) return compose(reference);
    URLParts target = reference;
    target.scheme = base.scheme;
    std::string path;
    if (!reference.host) {
        target.user = base.user;
        target.host = base.host;
        target.port = base.port;
    }
    if (!reference.host && reference.path.empty()) {
        path = base.path;
        if (!reference.query) target.query = base.query;
    } else {
        path = resolvePath(base, reference);
    }
    target.path = path;
    return compose(target);
}

std::string removeDotSegments(std::string_view path) {
    std::string output;
    const auto dropLast = [&] {
        const std::size_t slash = output.rfind('/');
        output.erase(slash == npos ? 0 : slash);
    };
    while (!path.empty()) {
        if (path.starts_with("../")) {
            path.remove_prefix(3);
        } else if (path.starts_with("./") || path.starts_with("/./")) {
            path.remove_prefix(2);
        } else if (path == "/.") {
            path = "/";
        } else if (path.starts_with("/../")) {
            path.remove_prefix(3);
            dropLast();
        } else if (path == "/..") {
            path = "/";
            dropLast();
        } else if (path == "." || path == "..") {
            path = {};
        } else {
            const std::size_t end = std::min(path.find('/', 1), path.size());
            output += path.substr(0, end);
            path.remove_prefix(end);
        }
    }
    return output;
}

}  // namespace Foundation
