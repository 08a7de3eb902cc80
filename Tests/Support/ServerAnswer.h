#pragma once

#include <cstdint>
#include <limits>
#include <string>
#include <utility>
#include <vector>

namespace Support {

/// What a server does, one step of an answer.
struct ServerStep {
    enum class Kind {
        Send,   ///< `text`, `times` times
        Wait,   ///< until the test lets one through the gate `text`
        Reset,  ///< breaks the connection, with what was sent before lost or not
        Close,  ///< ends the connection in order
    };
    Kind kind = Kind::Send;
    std::string text;
    std::uint64_t times = 1;
};

/// One answer of a `ScriptedServer`, written down beforehand: right by itself, and wrong where the
/// test says so. Its parts are sent in the order in which they are named here, behind the head.
class ServerAnswer {
 public:
    static constexpr std::uint64_t kForEver = std::numeric_limits<std::uint64_t>::max();

    explicit ServerAnswer(int status = 200) : mStatus(status) {}
    /// These bytes instead of a head.
    static ServerAnswer raw(std::string bytes);
    static ServerAnswer redirect(int status, std::string location);

    // The head.

    ServerAnswer& header(std::string name, std::string value);
    /// Holds the whole answer back until the test lets it through.
    ServerAnswer& holdHead(std::string gate);
    /// Names another length than the body has.
    ServerAnswer& claimLength(std::uint64_t length);
    /// Names none: the end of the connection is that of the body.
    ServerAnswer& withoutLength();
    /// Names none: every piece of the body is a chunk, and the last one is empty.
    ServerAnswer& chunked();

    // What follows.

    /// A piece of the body, so many times. One that is sent for ever has no length.
    ServerAnswer& body(std::string bytes, std::uint64_t times = 1);
    /// Goes on when the test lets one through the gate: see `ScriptedServer::letThrough`.
    ServerAnswer& wait(std::string gate);
    ServerAnswer& reset();
    ServerAnswer& close();

    /// All of it, from the first byte on.
    std::vector<ServerStep> getSteps() const;

 private:
    enum class Length { Named, Chunks, None };

    std::string head(std::uint64_t length) const;
    ServerStep chunk(const ServerStep& piece) const;

    int mStatus;
    bool mIsRaw = false;
    std::string mRaw;
    std::vector<std::pair<std::string, std::string>> mHeaders;
    std::string mHeadGate;
    Length mLength = Length::Named;
    bool mClaims = false;
    std::uint64_t mClaimed = 0;
    std::vector<ServerStep> mSteps;
};

}  // namespace Support
