#pragma once

#include "Foundation/Timer.h"
#include "Net/CookieAcceptPolicy.h"

#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <tuple>
#include <vector>

namespace Foundation {
class URL;
}

namespace Orvane {

/// The user's cookies, in a file that several processes may share. What a cookie means is the
/// business of the `Transport`, which is given those that may be sent to a host and gives back what
/// has become of them.
///
/// A cookie is a line of the file: domain, whether its subdomains count, path, whether it is for
/// secure connections only, its end in seconds since 1970 or 0 for that of the session, name and
/// value, with tabs between them, and "#HttpOnly_" before the domain of one that is not for
/// scripts. Those of the session are kept as long as the process.
class CookieStore : Foundation::Uncopyable {
 public:
    static constexpr std::size_t kMaxCookies = 3000;  ///< what is more is not taken
    static constexpr std::size_t kMaxPerDomain = 50;
    static constexpr std::size_t kMaxLineBytes = 8192;

    using Lines = std::vector<std::string>;

    /// An empty path keeps all in memory.
    explicit CookieStore(std::string path);
    /// Saves what was still to be saved.
    ~CookieStore();

    CookieAcceptPolicy getAcceptPolicy() const { return mAcceptPolicy; }
    void setAcceptPolicy(CookieAcceptPolicy policy) { mAcceptPolicy = policy; }

    /// Those that are for the host of the URL, as far as the domain tells.
    Lines findFor(const Foundation::URL& url);
    /// An exchange was given `before` and has made `after` of it. Saved at the end of the turn.
    void update(const Lines& before, const Lines& after);

    /// Whether a policy lets the cookies of `host` be kept where `asked` is the host that the
    /// request was for. Two hosts are of one site if one lies in the domain of the other.
    static bool accepts(CookieAcceptPolicy policy, std::string_view host, std::string_view asked);

 private:
    /// Domain, path and name.
    using Key = std::tuple<std::string, std::string, std::string>;
    struct Cookie;
    using Cookies = std::map<Key, Cookie>;

    static std::optional<std::pair<Key, Cookie>> parse(const std::string& line);
    static Cookies parse(const Lines& lines);
    Cookies readFile() const;
    void loadIfNeeded();
    bool hasRoomFor(const Key& key) const;
    void change(const Key& key, const Cookie* cookie);
    void save();

    const std::string mPath;
    CookieAcceptPolicy mAcceptPolicy = CookieAcceptPolicy::OnlyFromMainDocument;
    bool mIsLoaded = false;
    Cookies mCookies;
    std::map<Key, std::optional<std::string>> mChanges;  ///< since the last save; none is removed
    Foundation::Timer<CookieStore> mSaveTimer;
};

struct CookieStore::Cookie {
    std::string line;
    std::string host;  ///< of the domain, without a "." before it
    bool countsForSubdomains = false;
    double expires = 0;  ///< seconds since 1970; 0 with the session

    bool isOfSession() const { return expires == 0; }
    bool isFor(std::string_view host) const;
    bool isOver() const;
};

}  // namespace Orvane
