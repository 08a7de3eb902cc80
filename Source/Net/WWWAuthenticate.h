#pragma once

#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace Orvane {

/// The value of a `WWW-Authenticate`, or of several joined by commas: RFC 9110, 11.6.1. What does
/// not follow the grammar is skipped.
class WWWAuthenticate {
 public:
    struct Challenge {
        std::string scheme;
        std::vector<std::pair<std::string, std::string>> parameters;

        /// Empty if there is none of that name, which is compared without case.
        std::string getParameter(std::string_view name) const;
    };

    explicit WWWAuthenticate(std::string_view value);

    const std::vector<Challenge>& challenges() const { return mChallenges; }
    /// The first of a scheme, which is compared without case; null if there is none.
    const Challenge* find(std::string_view scheme) const;

 private:
    void readElement(std::string_view element);

    std::vector<Challenge> mChallenges;
};

}  // namespace Orvane
