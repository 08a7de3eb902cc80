#pragma once

#include "FeedParser/Text/TidyResult.h"

#include <cstdint>
#include <string>
#include <string_view>

namespace Orvane::FeedParser {

/// What goes through the pipe to the program that tidies, and back: a header of fixed size, with
/// the lengths of the texts that follow it. Both ends are of the same library, on the same machine,
/// so numbers are in its own form. A text that is longer than `Bounds::kTidyBytes` is refused.

struct TidyRequest {
    std::string className;  ///< of the tidier
    std::int32_t encoding = 0;
    std::string base;  ///< the URL, empty for none
    std::string markup;
};

struct TidyReply {
    TidyResult result;
    /// What was logged meanwhile, a line each: "!" and a warning, or " " and a line of the
    /// parser's.
    std::string log;
};

/// One end of that pipe: a socket, which it does not own.
class TidyPipe {
 public:
    enum class Outcome {
        Done,
        Late,    ///< not before the deadline
        Ended,   ///< the other end is gone
        Broken,  ///< what came is no such message
    };
    /// No deadline.
    static constexpr double kNever = 1e300;

    explicit TidyPipe(int fd) : mFD(fd) {}

    // Deadlines are seconds of `monotonicSeconds`.
    Outcome sendRequest(std::string_view className, std::int32_t encoding, std::string_view base,
                        std::string_view markup, double deadline) const;
    Outcome receiveRequest(TidyRequest& request, double deadline) const;
    Outcome sendReply(const TidyReply& reply, double deadline) const;
    Outcome receiveReply(TidyReply& reply, double deadline) const;

    /// Waits until there is something to read, or the other end is gone.
    Outcome awaitInput(double deadline) const;

    /// The machine's clock since some start: what a process that runs beside this one goes by.
    static double monotonicSeconds();

 private:
    struct Header;

    Outcome await(short events, double deadline) const;
    Outcome send(std::string_view bytes, double deadline) const;
    Outcome receive(char* bytes, std::size_t length, double deadline) const;
    Outcome receiveHeader(Header& header, double deadline) const;
    Outcome receiveText(std::string& text, std::uint32_t length, double deadline) const;

    int mFD;
};

}  // namespace Orvane::FeedParser
