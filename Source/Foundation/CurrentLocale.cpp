#include "Foundation/CurrentLocale.h"

#include <unicode/dcfmtsym.h>
#include <unicode/locid.h>

#include <clocale>
#include <cstdlib>
#include <string_view>

namespace Foundation {

namespace {

bool isC(std::string_view name) {
    return name.empty() || name == "C" || name == "POSIX" || name.starts_with("C.");
}

/// What the environment says of a category: the first of the variables that has a value.
std::string_view fromEnvironment(const char* category) {
    for (const char* variable : {"LC_ALL", category, "LANG"}) {
        const char* value = std::getenv(variable);
        if (value && *value) return value;
    }
    return {};
}

std::string currentLocale(int category, const char* variable) {
    const char* set = std::setlocale(category, nullptr);
    std::string_view name = set ? set : "";
    // Programs that set no locale, and machines that have not got the user's, still have users.
    if (isC(name)) name = fromEnvironment(variable);
    if (isC(name)) return "en_US_POSIX";
    return icu::Locale::createCanonical(std::string(name).c_str()).getName();
}

}  // namespace

std::string currentTimeLocale() {
    return currentLocale(LC_TIME, "LC_TIME");
}

std::string currentNumberLocale() {
    return currentLocale(LC_NUMERIC, "LC_NUMERIC");
}

std::string currentDecimalSign() {
    UErrorCode status = U_ZERO_ERROR;
    const icu::DecimalFormatSymbols symbols(icu::Locale(currentNumberLocale().c_str()), status);
    if (U_FAILURE(status)) return ".";
    std::string utf8;
    return symbols.getConstSymbol(icu::DecimalFormatSymbols::kDecimalSeparatorSymbol)
        .toUTF8String(utf8);
}

}  // namespace Foundation
