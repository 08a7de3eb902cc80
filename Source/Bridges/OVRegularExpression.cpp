#include <Orvane/OVRegularExpression.h>

#include "Bridges/Barriers.h"
#include "Foundation/Bundle.h"
#include "Foundation/ICUText.h"

#include <unicode/uregex.h>
#include <unicode/utext.h>

#include <new>
#include <utility>

using namespace Foundation;
using namespace Orvane;

static_assert(OVRegularExpression::UnixLines == static_cast<int>(UREGEX_UNIX_LINES));
static_assert(OVRegularExpression::CaseInsensitive == static_cast<int>(UREGEX_CASE_INSENSITIVE));
static_assert(OVRegularExpression::Comments == static_cast<int>(UREGEX_COMMENTS));
static_assert(OVRegularExpression::Multiline == static_cast<int>(UREGEX_MULTILINE));
static_assert(OVRegularExpression::Literal == static_cast<int>(UREGEX_LITERAL));
static_assert(OVRegularExpression::DotMatchesLineEnds == static_cast<int>(UREGEX_DOTALL));
static_assert(OVRegularExpression::UnicodeWordBoundaries == static_cast<int>(UREGEX_UWORD));
static_assert(OVRegularExpression::ErrorOnUnknownEscapes ==
              static_cast<int>(UREGEX_ERROR_ON_UNKNOWN_ESCAPES));

namespace {

using Expression = std::unique_ptr<URegularExpression, void (*)(URegularExpression*)>;
using Text = std::unique_ptr<UText, UText* (*)(UText*)>;

/// ICU reads the pattern's characters once; longer ones are somebody's attack or mistake.
constexpr int kPatternBound = 1024;

OVError errorIn(const UParseError& place, UErrorCode code) {
    const AutoreleasePool pool;
    OVError error(OVRegularExpressionErrorDomain, code);
    error.setDescription(localizedText("Regular expression syntax error"));
    error.setUserInfo({{"ErrorLine", place.line}, {"ErrorPosition", place.offset}});
    return error;
}

}  // namespace

struct OVRegularExpression::Search {
    explicit Search(URegularExpression* compiled) : expression(compiled, uregex_close) {}

    /// Null, with the error, for what is no pattern.
    static std::unique_ptr<Search> compile(std::string_view pattern, std::uint32_t options,
                                           std::optional<OVError>& error);

    bool matchesFrom(std::int64_t index) {
        // ICU has a meaning of its own for -1.
        status = index < 0 ? U_INDEX_OUTOFBOUNDS_ERROR : U_ZERO_ERROR;
        return uregex_matches64(expression.get(), index, &status) && U_SUCCESS(status);
    }

    std::optional<std::string> textOf(const OVRange& range) const {
        if (!range.isFound()) return std::nullopt;
        return text.substr(static_cast<std::size_t>(range.location),
                           static_cast<std::size_t>(range.length));
    }

    Expression expression;
    UErrorCode status = U_ZERO_ERROR;
    std::string text;  ///< what `expression` searches in place
};

std::unique_ptr<OVRegularExpression::Search> OVRegularExpression::Search::compile(
    std::string_view pattern, std::uint32_t options, std::optional<OVError>& error) {
    const icu::UnicodeString wide = ICUText::wide(pattern);
    const int length = wide.length();
    requireParameter(length > 0 && length < kPatternBound, "OVRegularExpression",
                     "length>0 && length<1024");
    UParseError place{};
    UErrorCode status = U_ZERO_ERROR;
    URegularExpression* compiled = uregex_open(wide.getBuffer(), length, options, &place, &status);
    if (U_SUCCESS(status)) return std::make_unique<Search>(compiled);
    uregex_close(compiled);
    error = errorIn(place, status);
    return nullptr;
}

OVRegularExpression::OVRegularExpression(std::unique_ptr<Search> search)
    : mSearch(std::move(search)) {}

OVRegularExpression::OVRegularExpression(std::string_view pattern, std::uint32_t options) {
    std::optional<OVError> error;
    mSearch = Search::compile(pattern, options, error);
    if (!mSearch) throw OVException(error->description(), *error);
}

OVRegularExpression::~OVRegularExpression() = default;

std::unique_ptr<OVRegularExpression> OVRegularExpression::regularExpressionWithPattern(
    std::string_view pattern, std::uint32_t options, std::optional<OVError>* error) {
    std::optional<OVError> reason;
    std::unique_ptr<Search> search = Search::compile(pattern, options, reason);
    if (error) *error = reason;
    if (!search) return nullptr;
    return std::unique_ptr<OVRegularExpression>(new OVRegularExpression(std::move(search)));
}

std::unique_ptr<OVRegularExpression> OVRegularExpression::copy() const {
    UErrorCode status = U_ZERO_ERROR;
    URegularExpression* clone = uregex_clone(mSearch->expression.get(), &status);
    if (U_FAILURE(status)) return nullptr;
    return std::unique_ptr<OVRegularExpression>(
        new OVRegularExpression(std::make_unique<Search>(clone)));
}

int OVRegularExpression::lastError() const {
    return mSearch->status;
}

bool OVRegularExpression::setSearchString(std::string text) {
    UErrorCode& status = mSearch->status;
    status = U_ZERO_ERROR;
    mSearch->text = std::move(text);
    const Text opened(utext_openUTF8(nullptr, mSearch->text.data(),
                                     static_cast<std::int64_t>(mSearch->text.size()), &status),
                      utext_close);
    // ICU keeps a view of its own, on the same bytes.
    uregex_setUText(mSearch->expression.get(), opened.get(), &status);
    uregex_reset64(mSearch->expression.get(), 0, &status);
    return status == U_ZERO_ERROR;
}

bool OVRegularExpression::matches() {
    return mSearch->matchesFrom(0);
}

bool OVRegularExpression::matchesFrom(std::int64_t index) {
    return mSearch->matchesFrom(index);
}

bool OVRegularExpression::matchesString(std::string text) {
    return setSearchString(std::move(text)) && matches();
}

void OVRegularExpression::resetMatches() {
    mSearch->status = U_ZERO_ERROR;
    uregex_reset64(mSearch->expression.get(), 0, &mSearch->status);
}

OVRange OVRegularExpression::rangeOfNextMatch() {
    mSearch->status = U_ZERO_ERROR;
    const bool isFound = uregex_findNext(mSearch->expression.get(), &mSearch->status);
    return isFound && U_SUCCESS(mSearch->status) ? rangeOfMatchedGroup(0) : OVRange();
}

OVRange OVRegularExpression::rangeOfMatchedGroup(std::int32_t group) {
    UErrorCode& status = mSearch->status;
    status = U_ZERO_ERROR;
    const std::int64_t start = uregex_start64(mSearch->expression.get(), group, &status);
    const std::int64_t end = uregex_end64(mSearch->expression.get(), group, &status);
    // ICU says -1 of a group that has no part in the match.
    if (U_FAILURE(status) || start < 0) return {};
    return {start, end - start};
}

std::optional<std::string> OVRegularExpression::nextMatch() {
    return mSearch->textOf(rangeOfNextMatch());
}

std::optional<std::string> OVRegularExpression::matchedGroup(std::int32_t group) {
    return mSearch->textOf(rangeOfMatchedGroup(group));
}
