#include "Net/CookieStore.h"

#include "Foundation/AtomicFile.h"
#include "Foundation/Clock.h"
#include "Foundation/Guard.h"
#include "Foundation/URL.h"
#include "Net/HTTPMessage.h"
#include "Net/ProtectionSpace.h"

#include <algorithm>
#include <charconv>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <utility>

namespace Orvane {

namespace {

constexpr std::string_view kHttpOnly = "#HttpOnly_";
constexpr const char* kFirstLine = "# Netscape HTTP Cookie File\n";

/// Whether `host` is `domain` or lies in it.
bool isIn(std::string_view host, std::string_view domain) {
    if (host.size() == domain.size()) return HTTPMessage::isSameName(host, domain);
    return host.size() > domain.size() && host[host.size() - domain.size() - 1] == '.' &&
           HTTPMessage::isSameName(host.substr(host.size() - domain.size()), domain);
}

std::vector<std::string> fieldsOf(std::string_view line) {
    std::vector<std::string> fields;
    std::size_t begin = 0;
    for (std::size_t end; (end = line.find('\t', begin)) != std::string_view::npos;) {
        fields.emplace_back(line.substr(begin, end - begin));
        begin = end + 1;
    }
    fields.emplace_back(line.substr(begin));
    return fields;
}

}  // namespace

bool CookieStore::Cookie::isFor(std::string_view asked) const {
    return countsForSubdomains ? isIn(asked, host) : HTTPMessage::isSameName(asked, host);
}

bool CookieStore::Cookie::isOver() const {
    return !isOfSession() &&
           expires <= Foundation::Clock::current().now() + Foundation::kUnixEpochOffset;
}

bool CookieStore::accepts(CookieAcceptPolicy policy, std::string_view host,
                          std::string_view asked) {
    switch (policy) {
        case CookieAcceptPolicy::Always:
            return true;
        case CookieAcceptPolicy::Never:
            return false;
        case CookieAcceptPolicy::OnlyFromMainDocument:
            break;
    }
    return isIn(host, asked) || isIn(asked, host);
}

CookieStore::CookieStore(std::string path)
    : mPath(std::move(path)), mSaveTimer(this, &CookieStore::save) {}

CookieStore::~CookieStore() {
    Foundation::callGuarded(__PRETTY_FUNCTION__, [this] { save(); });
}

std::optional<std::pair<CookieStore::Key, CookieStore::Cookie>> CookieStore::parse(
    const std::string& line) {
    constexpr std::size_t kFields = 7;
    std::string_view text = line;
    if (text.starts_with(kHttpOnly)) text.remove_prefix(kHttpOnly.size());
    if (text.starts_with('#') || line.size() > kMaxLineBytes) return {};
    const std::vector<std::string> fields = fieldsOf(text);
    if (fields.size() != kFields || fields[0].empty() || fields[5].empty()) return {};
    long long expires = 0;
    std::from_chars(fields[4].data(), fields[4].data() + fields[4].size(), expires);
    Cookie cookie{line, fields[0], fields[1] == "TRUE", static_cast<double>(expires)};
    if (cookie.host.front() == '.') cookie.host.erase(0, 1);
    return {{Key(fields[0], fields[2], fields[5]), std::move(cookie)}};
}

CookieStore::Cookies CookieStore::parse(const Lines& lines) {
    Cookies cookies;
    for (const std::string& line : lines) {
        if (auto cookie = parse(line)) cookies.insert_or_assign(cookie->first, cookie->second);
    }
    return cookies;
}

CookieStore::Cookies CookieStore::readFile() const {
    if (mPath.empty()) return {};
    Lines lines;
    std::ifstream file(mPath);
    for (std::string line; std::getline(file, line) && lines.size() < 2 * kMaxCookies;) {
        lines.push_back(std::move(line));
    }
    Cookies cookies = parse(lines);
    std::erase_if(cookies, [](const auto& each) { return each.second.isOver(); });
    return cookies;
}

void CookieStore::loadIfNeeded() {
    if (!std::exchange(mIsLoaded, true)) mCookies = readFile();
}

CookieStore::Lines CookieStore::findFor(const Foundation::URL& url) {
    loadIfNeeded();
    const std::string host = Origin::of(url).host;
    Lines lines;
    for (const auto& [key, cookie] : mCookies) {
        if (cookie.isFor(host) && !cookie.isOver()) lines.push_back(cookie.line);
    }
    return lines;
}

void CookieStore::update(const Lines& before, const Lines& after) {
    loadIfNeeded();
    const Cookies old = parse(before);
    const Cookies now = parse(after);
    for (const auto& [key, cookie] : old) {
        if (!now.contains(key)) change(key, nullptr);
    }
    for (const auto& [key, cookie] : now) {
        const auto known = old.find(key);
        if (known == old.end() || known->second.line != cookie.line) change(key, &cookie);
    }
    if (!mChanges.empty()) mSaveTimer.start(0.0, false);
}

bool CookieStore::hasRoomFor(const Key& key) const {
    if (mCookies.contains(key)) return true;
    const auto ofDomain = std::ranges::count_if(
        mCookies, [&](const auto& each) { return std::get<0>(each.first) == std::get<0>(key); });
    return mCookies.size() < kMaxCookies && static_cast<std::size_t>(ofDomain) < kMaxPerDomain;
}

/// Null removes.
void CookieStore::change(const Key& key, const Cookie* cookie) {
    if (!cookie) {
        mCookies.erase(key);
        mChanges[key] = std::nullopt;
        return;
    }
    if (!hasRoomFor(key)) {
        Foundation::gWarn.log("%s: too many cookies", std::get<0>(key));
        return;
    }
    mCookies.insert_or_assign(key, *cookie);
    // One that is now of the session has no place in the file any more.
    mChanges[key] = cookie->isOfSession() ? std::nullopt : std::optional(cookie->line);
}

/// Puts what was changed here into what the file holds by now.
void CookieStore::save() {
    mSaveTimer.stop();
    if (mPath.empty() || mChanges.empty()) return;
    Cookies kept = readFile();
    for (const auto& [key, line] : std::exchange(mChanges, {})) {
        kept.erase(key);
        if (line) kept.insert_or_assign(key, parse(*line)->second);
    }
    std::string content = kFirstLine;
    for (const auto& [key, cookie] : kept) {
        content += cookie.line + "\n";
    }
    std::erase_if(mCookies, [](const auto& each) { return !each.second.isOfSession(); });
    mCookies.merge(kept);
    std::error_code failure;
    std::filesystem::create_directories(std::filesystem::path(mPath).parent_path(), failure);
    const int error = Foundation::AtomicFile::write(mPath, content);
    if (error != 0) {
        Foundation::gWarn.log("Can't write \"%s\": %s", mPath, std::strerror(error));
    }
}

}  // namespace Orvane
