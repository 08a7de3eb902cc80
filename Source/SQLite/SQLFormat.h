#pragma once

#include "Foundation/String.h"

#include <Orvane/OVFormat.h>

#include <concepts>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <type_traits>

/// Formats of SQL, with the conversions of sqlite3's printf, checked against their arguments when
/// they are compiled: %s, %q (quotes doubled), %Q (the same in quotes, NULL for null) and %w (for
/// names) take texts, %d, %i and %lld integers, %f and %g reals. A text that is known only at run
/// time is an argument or a whole text, never a format.

namespace SQLite {

/// One argument of a format. Refers to the caller's argument.
class SQLArgument {
 public:
    enum class Kind : std::uint8_t { Integer, Real, Text };

    SQLArgument(std::integral auto value)
        : mKind(Kind::Integer), mInteger(static_cast<long long>(value)) {}
    SQLArgument(std::floating_point auto value)
        : mKind(Kind::Real), mReal(static_cast<double>(value)) {}
    SQLArgument(const char* text) : mKind(Kind::Text), mText(text) {}
    SQLArgument(const std::string& text) : SQLArgument(text.c_str()) {}
    SQLArgument(const Foundation::String* text)
        : SQLArgument(text ? text->utf8().c_str() : nullptr) {}

    Kind kind() const { return mKind; }
    long long integer() const { return mInteger; }
    double real() const { return mReal; }
    const char* text() const { return mText; }

    template <class T>
    static consteval Kind kindOf() {
        if constexpr (std::integral<T>) {
            return Kind::Integer;
        } else {
            return std::floating_point<T> ? Kind::Real : Kind::Text;
        }
    }

 private:
    Kind mKind;
    union {
        long long mInteger;
        double mReal;
        const char* mText;
    };
};

namespace SQLFormatChecks {

constexpr bool fits(char conversion, SQLArgument::Kind kind) {
    switch (conversion) {
        case 's':
        case 'q':
        case 'Q':
        case 'w':
            return kind == SQLArgument::Kind::Text;
        case 'd':
        case 'i':
            return kind == SQLArgument::Kind::Integer;
        case 'f':
        case 'g':
            return kind == SQLArgument::Kind::Real;
        default:
            return false;
    }
}

/// One conversion of a format.
struct Conversion {
    std::size_t end = 0;     ///< behind its letter
    std::string_view flags;  ///< flags, width and precision, without length modifier
    char letter = 0;         ///< 0 if the format ends inside the conversion
};

/// Reads the conversion whose "%" stands at `start`. Not that of `OVFormat`, for which "q" is a
/// length modifier.
constexpr Conversion readConversion(std::string_view format, std::size_t start) {
    std::size_t i = start + 1;
    auto skip = [&](std::string_view set) {
        while (i < format.size() && OVFormatChecks::isOneOf(format[i], set))
            ++i;
    };
    skip("-+ #0123456789.");
    Conversion c;
    c.flags = format.substr(start + 1, i - start - 1);
    skip("l");
    c.letter = i < format.size() ? format[i] : '\0';
    c.end = i < format.size() ? i + 1 : i;
    return c;
}

consteval void check(std::string_view format, std::span<const SQLArgument::Kind> kinds) {
    using OVFormatChecks::formatConversionDoesNotFitItsArgument;
    using OVFormatChecks::formatHasAnUnknownConversion;
    using OVFormatChecks::formatHasFewerConversionsThanArguments;
    using OVFormatChecks::formatHasMoreConversionsThanArguments;
    std::size_t used = 0;
    for (std::size_t i = format.find('%'); i != std::string_view::npos; i = format.find('%', i)) {
        if (i + 1 < format.size() && format[i + 1] == '%') {
            i += 2;
            continue;
        }
        const Conversion c = readConversion(format, i);
        if (!OVFormatChecks::isOneOf(c.letter, "sqQwdifg")) formatHasAnUnknownConversion();
        if (used == kinds.size()) {
            formatHasMoreConversionsThanArguments();
        } else if (!SQLFormatChecks::fits(c.letter, kinds[used])) {
            formatConversionDoesNotFitItsArgument();
        }
        ++used;
        i = c.end;
    }
    if (used < kinds.size()) formatHasFewerConversionsThanArguments();
}

}  // namespace SQLFormatChecks

/// A format literal that fits arguments of the types `Args`.
template <class... Args>
class SQLBasicFormatString {
 public:
    template <std::size_t N>
    consteval SQLBasicFormatString(const char (&format)[N]) : mText(format, N - 1) {
        constexpr SQLArgument::Kind kinds[sizeof...(Args) + 1] = {
            SQLArgument::kindOf<std::remove_cvref_t<Args>>()..., SQLArgument::Kind::Text};
        SQLFormatChecks::check({format, N - 1}, {kinds, sizeof...(Args)});
    }

    std::string_view text() const { return mText; }

 private:
    std::string_view mText;
};

/// The parameter type of a formatting function: keeps the format out of template deduction.
template <class... Args>
using SQLFormatString = SQLBasicFormatString<std::type_identity_t<Args>...>;

}  // namespace SQLite
