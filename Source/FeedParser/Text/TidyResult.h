#pragma once

#include <string>
#include <utility>

namespace Orvane::FeedParser {

/// What tidying a document came to.
struct TidyResult {
    /// Tidy's own: 0, 1 with warnings, 2 with errors that it cannot mend, negative where it could
    /// not go on.
    int code = kNothing;
    std::string output;    ///< of 0 and 1
    std::string messages;  ///< of other results: what Tidy wrote about it, or why there is none

    bool isSuccess() const { return code == 0 || code == 1; }

    /// There is no result: Tidy could not be set up, or took too much.
    static constexpr int kNothing = -1000;
    static TidyResult nothing(std::string why) { return {kNothing, {}, std::move(why)}; }
};

}  // namespace Orvane::FeedParser
