#pragma once

#include <Orvane/OVBase.h>
#include <Orvane/OVError.h>

#include <cstdint>
#include <limits>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

/// The domain of errors of regular expressions. Codes are ICU's (`UErrorCode`). What the error's
/// `userInfo` has: "ErrorLine", from 1 on, and "ErrorPosition" in that line, in UTF-16 units.
inline constexpr char OVRegularExpressionErrorDomain[] = "OVRegularExpression";

/// A piece of a text, in bytes of its UTF-8.
struct OVRange {
    /// The location of what is not there.
    static constexpr std::int64_t kNotFound = std::numeric_limits<std::int64_t>::max();

    /// Where it begins, and how long it is.
    std::int64_t location = kNotFound;
    std::int64_t length = 0;

    /// Whether there is such a piece.
    bool isFound() const { return location != kNotFound; }
    /// By location and length.
    bool operator==(const OVRange&) const = default;
};

/// A regular expression as ICU has them, compiled, with the text that it searches and the place of
/// the last match in it. Texts are UTF-8; what is not valid in one counts as U+FFFD.
///
/// Nothing here throws but where it says so: whether the last operation failed tells `lastError`.
/// An object is for one thread at a time, whichever that is.
class OVRegularExpression {
 public:
    /// How a pattern is read. Any number of them, added up.
    enum Options : std::uint32_t {
        None = 0,
        UnixLines = 1,  ///< only "\n" ends a line
        CaseInsensitive = 2,
        Comments = 4,   ///< blanks and what follows a "#" do not count
        Multiline = 8,  ///< "^" and "$" also match at the lines' ends
        Literal = 16,   ///< the pattern is a text to be found as it stands
        DotMatchesLineEnds = 32,
        UnicodeWordBoundaries = 256,
        ErrorOnUnknownEscapes = 512,
    };

    /// Null, with the error if `error` is given, for a pattern that is none. Throws `OVException`
    /// for one that is empty or has 1024 UTF-16 units or more.
    OV_EXPORT static std::unique_ptr<OVRegularExpression> regularExpressionWithPattern(
        std::string_view pattern, std::uint32_t options = None,
        std::optional<OVError>* error = nullptr);
    /// The same, but throws `OVException`, with the error, where the above gives null.
    OV_EXPORT explicit OVRegularExpression(std::string_view pattern, std::uint32_t options = None);

    OV_EXPORT ~OVRegularExpression();
    OVRegularExpression(const OVRegularExpression&) = delete;
    OVRegularExpression& operator=(const OVRegularExpression&) = delete;

    /// The same expression, with no text to search yet. Null if ICU cannot copy it.
    OV_EXPORT std::unique_ptr<OVRegularExpression> copy() const;

    /// What ICU said to the last operation: 0 if nothing was wrong.
    OV_EXPORT int lastError() const;

    /// Takes over what is to be searched, from its start on. Whether that worked.
    OV_EXPORT bool setSearchString(std::string text);

    // Without a text to search, what follows is an error and finds nothing.

    /// Whether the whole text matches.
    OV_EXPORT bool matches();
    /// Whether all of the text from a byte on matches.
    OV_EXPORT bool matchesFrom(std::int64_t index);
    /// `setSearchString`, then `matches`.
    OV_EXPORT bool matchesString(std::string text);

    /// Lets the search begin at the start of the text again.
    OV_EXPORT void resetMatches();
    /// Where the next match is, behind the last one.
    OV_EXPORT OVRange rangeOfNextMatch();
    /// Where a group of the last match is: 0 is all of it. Not found if the group has no part in
    /// the match, if there was none, or if the pattern has no such group.
    OV_EXPORT OVRange rangeOfMatchedGroup(std::int32_t group);
    /// The texts there; none where nothing is found.
    OV_EXPORT std::optional<std::string> nextMatch();
    OV_EXPORT std::optional<std::string> matchedGroup(std::int32_t group);

 private:
    struct Search;
    explicit OVRegularExpression(std::unique_ptr<Search> search);

    std::unique_ptr<Search> mSearch;
};
