#include "Foundation/URL.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Data.h"
#include "Foundation/Logger.h"
#include "Foundation/URLCharacters.h"
#include "Foundation/URLRanges.h"

#include <glib.h>
#include <unistd.h>

#include <algorithm>
#include <charconv>
#include <climits>
#include <functional>
#include <stdexcept>

namespace Foundation {

namespace {

constexpr auto npos = std::string_view::npos;
constexpr int kLargestPort = 65535;

bool equalsIgnoringCase(std::string_view a, std::string_view b) {
    return a.size() == b.size() && g_ascii_strncasecmp(a.data(), b.data(), a.size()) == 0;
}

StringReturner textOf(std::optional<std::string_view> part) {
    return part ? String::string(std::string(*part)) : nullptr;
}

/// The text behind the escapes; null where there is none or it is no UTF-8.
StringReturner unescapedTextOf(std::optional<std::string_view> part, std::string_view leave = {}) {
    if (!part) return nullptr;
    const std::optional<std::string> bytes = unescapeURLText(*part, leave);
    if (!bytes) return nullptr;
    const std::string& text = *bytes;
    const bool isText = g_utf8_validate_len(text.data(), text.size(), nullptr);
    return isText ? String::string(text) : nullptr;
}

[[noreturn]] void failBadPath() {
    throw std::runtime_error("URL::byAppending failed - bad path string?");
}

/// Whether a relative path leads down by every segment of it.
bool leadsDown(std::string_view path) {
    if (path.ends_with('/')) path.remove_suffix(1);
    for (std::size_t start = 0; start != npos;) {
        const std::size_t slash = path.find('/', start);
        const std::string_view segment = path.substr(start, slash - start);
        if (segment.empty() || segment == "." || segment == "..") return false;
        if (segment.find('\0') != npos) return false;
        start = slash == npos ? npos : slash + 1;
    }
    return true;
}

}  // namespace

URL::URL(std::string text) : mText(std::move(text)) {}

URLReturner URL::make(std::string text, const URL* base) {
    Ref<URL> made = URLReturner(new URL(std::move(text)));
    const std::optional<URLParts> parts = URLParts::parse(made->mText);
    if (!parts) return nullptr;
    made->mParts = *parts;
    if (base && !parts->scheme) made->mAbsolute = make(resolveURL(base->parts(), *parts));
    return made;
}

URLReturner URL::url(String* text, URL* base) {
    if (!text || text->view().empty()) return nullptr;
    return make(text->utf8(), base);
}

URLReturner URL::lenientURL(String* text, URL* base) {
    if (!text || text->view().empty()) return nullptr;
    Ref<URL> result = url(text, base);
    if (!result) {
        const Ref<String> cleaned = String::string(cleanURLText(text->view()));
        gLog.log("lenientURLFromString: Cleaning up bad URL string <%@>, resulting in <%@>", text,
                 cleaned);
        result = url(cleaned, base);
    }
    if (!result) {
        gLog.log("lenientURLFromString: Unable to parse URL string <%@>", text);
        return nullptr;
    }
    if (!base) return result;
    if (result->hasScheme()) return result->getAbsoluteURL();
    gLog.log("lenientURLFromString: Unable to make <%@> absolute, relative to <%@>", result, base);
    return result;
}

URLReturner URL::urlWithFileSystemPath(const char* path, bool isDirectory) {
    if (!path || !*path) return nullptr;
    std::string absolute = path;
    if (*path != '/') {
        char current[PATH_MAX];
        if (!getcwd(current, sizeof current)) return nullptr;
        absolute = std::string(current) + "/" + absolute;
    }
    absolute.erase(absolute.find_last_not_of('/') + 1);
    if (isDirectory || absolute.empty()) absolute += '/';
    return make("file://" + escapeURLText(absolute, "?"));
}

URLReturner URL::urlWithFileSystemPath(String* path, PathStyle, bool isDirectory) {
    if (!path || path->view().find('\0') != npos) return nullptr;
    return urlWithFileSystemPath(path->utf8().c_str(), isDirectory);
}

StringReturner URL::getString() const {
    return String::string(mText);
}

StringReturner URL::getString(String* stillEscaped) const {
    if (!stillEscaped) return getString();
    return unescapedTextOf(mText, stillEscaped->view());
}

DataReturner URL::getData() const {
    return Data::adopt(mText);
}

StringReturner URL::getAbsoluteString() const {
    return absolute().getString();
}

URLReturner URL::getAbsoluteURL() const {
    return URLReturner::retained(const_cast<URL*>(&absolute()));
}

StringReturner URL::getScheme() const {
    return textOf(parts().scheme);
}

bool URL::isScheme(std::string_view scheme) const {
    return hasScheme() && equalsIgnoringCase(*parts().scheme, scheme);
}

StringReturner URL::getUser() const {
    const auto& user = parts().user;
    return user ? unescapedTextOf(user->substr(0, user->find(':'))) : nullptr;
}

StringReturner URL::getPassword() const {
    const auto& user = parts().user;
    const std::size_t colon = user ? user->find(':') : npos;
    return colon == npos ? nullptr : unescapedTextOf(user->substr(colon + 1));
}

StringReturner URL::getHost() const {
    const auto& host = parts().host;
    return host && !host->empty() ? textOf(host) : nullptr;
}

int URL::getPort() const {
    const std::string_view text = parts().port.value_or(std::string_view());
    int port = -1;
    const auto result = std::from_chars(text.data(), text.data() + text.size(), port);
    return result.ec == std::errc() && port <= kLargestPort ? port : -1;
}

StringReturner URL::getPath() const {
    return parts().isHierarchical() ? textOf(parts().path) : nullptr;
}

StringReturner URL::getQuery() const {
    return textOf(parts().query);
}

StringReturner URL::getFragment() const {
    return textOf(parts().fragment);
}

StringReturner URL::getResourceSpecifier() const {
    if (!hasScheme()) return nullptr;
    std::string specifier = absolute().mText.substr(parts().scheme->size() + 1);
    return specifier.empty() ? nullptr : String::string(std::move(specifier));
}

StringReturner URL::getRequestURIString() const {
    std::string text(parts().path);
    if (text.empty() && parts().isHierarchical()) text = "/";
    if (parts().query) (text += '?').append(*parts().query);
    return String::string(std::move(text));
}

StringReturner URL::getComponents(Component first, Component last, bool includeLast) const {
    const URLRanges ranges(mParts);
    const std::size_t begin = ranges[first].begin;
    const std::size_t end = includeLast ? ranges[last].end : ranges[last].mark;
    return begin < end ? String::string(mText.substr(begin, end - begin)) : nullptr;
}

std::string_view URL::lastSegment() const {
    if (!parts().isHierarchical()) return {};
    std::string_view path = parts().path;
    path = path.substr(0, path.find_last_not_of('/') + 1);
    return path.substr(path.rfind('/') + 1);
}

StringReturner URL::getLastPathComponent() const {
    const std::string_view segment = lastSegment();
    return segment.empty() ? nullptr : unescapedTextOf(segment);
}

StringReturner URL::getPathExtension() const {
    const Ref<String> name = getLastPathComponent();
    const std::size_t dot = name ? name->view().rfind('.') : npos;
    if (dot == npos || dot == 0 || dot + 1 == name->view().size()) return nullptr;
    return String::string(name->utf8().substr(dot + 1));
}

bool URL::hasDirectoryPath() const {
    if (!parts().isHierarchical()) return false;
    return parts().path.ends_with('/') || lastSegment() == "." || lastSegment() == "..";
}

bool URL::isLocalFile() const {
    const std::string_view host = parts().host.value_or(std::string_view());
    return isScheme("file") && parts().path.starts_with('/') &&
           (host.empty() || equalsIgnoringCase(host, "localhost"));
}

std::string URL::getFileSystemRepresentation() const {
    constexpr std::string_view kSlash = "/";
    if (!isLocalFile()) return {};
    // An escaped "/" is left as an escape here, which gives it away.
    std::optional<std::string> path = unescapeURLText(parts().path);
    const std::optional<std::string> probe = unescapeURLText(parts().path, kSlash);
    if (!path || path != probe || path->find('\0') != npos) return {};
    path->erase(std::max<std::size_t>(path->find_last_not_of('/') + 1, 1));
    return std::move(*path);
}

StringReturner URL::getFileSystemPath() const {
    std::string path = getFileSystemRepresentation();
    const bool isText = g_utf8_validate_len(path.data(), path.size(), nullptr);
    return isText && !path.empty() ? String::string(std::move(path)) : nullptr;
}

URLReturner URL::getSanitizedURL() const {
    if (!hasScheme()) return nullptr;
    for (const char* scheme : {"javascript", "script", "vbscript"}) {
        if (isScheme(scheme)) return nullptr;
    }
    return URLReturner::retained(const_cast<URL*>(this));
}

URLReturner URL::getSanitizedURL(const URL* url) {
    return url ? url->getSanitizedURL() : nullptr;
}

URLReturner URL::getURLWithoutUser() const {
    if (!parts().user) return getAbsoluteURL();
    const URLRanges ranges(parts());
    std::string text = absolute().mText;
    const std::size_t begin = ranges[Component::User].begin;
    return make(text.erase(begin, ranges[Component::Host].begin - begin));
}

URLReturner URL::withPath(const std::string& path) const {
    const std::size_t pathBegin = URLRanges(parts())[Component::Path].begin;
    return make(absolute().mText.substr(0, pathBegin) + path);
}

URLReturner URL::byAppending(String* path, bool isDirectory) const {
    OV_ASSERT_AS(path, "path");
    if (!parts().isHierarchical() || !leadsDown(path->view())) failBadPath();
    std::string joined(parts().path);
    if (!joined.ends_with('/') && (!joined.empty() || parts().host)) joined += '/';
    joined += escapeURLText(path->view(), "?");
    if (isDirectory && !joined.ends_with('/')) joined += '/';
    if (!isDirectory && joined.ends_with('/')) joined.pop_back();
    Ref<URL> result = withPath(joined);
    if (!result) failBadPath();
    return result;
}

URLReturner URL::byDeletingLastPathComponent() const {
    if (lastSegment().empty()) return getAbsoluteURL();
    const std::string path =
        parts().path.starts_with('/') ? removeDotSegments(parts().path) : std::string(parts().path);
    const std::size_t nameEnd = path.find_last_not_of('/');
    if (nameEnd == npos) return withPath("/");
    const std::size_t slash = path.rfind('/', nameEnd);
    return withPath(slash == npos ? "./" : path.substr(0, slash + 1));
}

URLReturner URL::byAppendingExtension(String* extension) const {
    OV_ASSERT_AS(extension, "extension");
    const std::string_view added = extension->view();
    if (lastSegment().empty() || !leadsDown(added) || added.find('/') != npos) failBadPath();
    std::string path(parts().path);
    path.erase(path.find_last_not_of('/') + 1);
    path += "." + escapeURLText(added, "?");
    return withPath(hasDirectoryPath() ? path + "/" : path);
}

std::size_t URL::getHash() const {
    return std::hash<std::string_view>()(absolute().mText);
}

bool URL::isEqual(const PFRefCounted* other) const {
    const auto* url = dynamic_cast<const URL*>(other);
    return url && url->absolute().mText == absolute().mText;
}

StringReturner URL::toString() const {
    return getString();
}

}  // namespace Foundation
