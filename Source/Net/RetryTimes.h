#pragma once

#include "Foundation/Uncopyable.h"

#include <map>
#include <optional>
#include <string>

namespace Foundation {
class URL;
}

namespace Orvane {

class HTTPMessage;

/// Which hosts have asked to be left alone, and until when: those that answered 429 or 503 with a
/// `Retry-After` (RFC 9110, 10.2.3; seconds or a date). Kept in a file, so that a restart does not
/// forget them; several processes may share it.
class RetryTimes : Foundation::Uncopyable {
 public:
    static constexpr double kMaxSeconds = 31 * 86400.0;  ///< what is said beyond counts as this
    static constexpr std::size_t kMaxHosts = 4096;       ///< those that wait the shortest go first

    /// What a host is not to be asked before, and what it said with that.
    struct Refusal {
        int status;
        double until;  ///< seconds since 2001
    };

    /// `path` is that of the file, which need not be there; an empty one keeps all in memory.
    explicit RetryTimes(std::string path) : mPath(std::move(path)) {}

    /// None if the host of the URL may be asked.
    std::optional<Refusal> find(const Foundation::URL& url);
    /// Takes note of what the host of the URL has answered. Writes the file if that was to wait;
    /// what cannot be written is warned of.
    void note(const Foundation::URL& url, const HTTPMessage& response);

    /// Seconds that a `Retry-After` asks for; none if it can't be understood. A date counts from
    /// the server's own.
    static std::optional<double> readDelay(const HTTPMessage& response, double now);

 private:
    using Refusals = std::map<std::string, Refusal>;

    static std::string hostOf(const Foundation::URL& url);
    Refusals readFile() const;
    void loadIfNeeded();
    void save();
    void prune(double now);

    const std::string mPath;
    bool mIsLoaded = false;
    Refusals mRefusals;  ///< by host, with the port if it is not the usual one
};

}  // namespace Orvane
