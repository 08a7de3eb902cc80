#pragma once

#include <Orvane/OVFormatArgument.h>

#include <cstddef>
#include <span>
#include <string_view>
#include <type_traits>

/// The check of a format against its arguments, which the compiler makes: see `OVFormat.h`.

namespace OVFormatChecks {

// Named for what the compiler prints when a format is refused: none is ever defined.
void formatHasMoreConversionsThanArguments();
void formatHasFewerConversionsThanArguments();
void formatHasAnUnknownConversion();
void formatConversionDoesNotFitItsArgument();

constexpr bool isOneOf(char c, std::string_view set) {
    return set.find(c) != std::string_view::npos;
}

constexpr bool fits(char conversion, OVFormatKind kind) {
    switch (conversion) {
        case 'd':
        case 'i':
        case 'u':
        case 'x':
        case 'X':
        case 'o':
        case 'c':
            return kind == OVFormatKind::Signed || kind == OVFormatKind::Unsigned;
        case 'f':
        case 'F':
        case 'e':
        case 'E':
        case 'g':
        case 'G':
        case 'a':
        case 'A':
            return kind == OVFormatKind::Floating;
        case 's':
            return kind == OVFormatKind::Text;
        case 'p':
            return kind == OVFormatKind::Pointer || kind == OVFormatKind::Object;
        case '@':
            return kind == OVFormatKind::Object;
        default:
            return false;
    }
}

/// One conversion of a format: `start` is the index of its "%", `end` that behind its letter.
struct Conversion {
    std::size_t start = 0;
    std::size_t end = 0;
    bool starWidth = false;
    bool starPrecision = false;
    std::string_view flags;  ///< flags, width and precision, without length modifier
    char letter = 0;         ///< 0 if the format ends inside the conversion
};

/// Reads the conversion whose "%" stands at `start`.
constexpr Conversion readConversion(std::string_view format, std::size_t start) {
    Conversion c;
    c.start = start;
    std::size_t i = start + 1;
    auto skip = [&](std::string_view set) {
        while (i < format.size() && isOneOf(format[i], set))
            ++i;
    };
    skip("-+ #0");
    c.starWidth = i < format.size() && format[i] == '*';
    skip(c.starWidth ? "*" : "0123456789");
    if (i < format.size() && format[i] == '.') {
        ++i;
        c.starPrecision = i < format.size() && format[i] == '*';
        skip(c.starPrecision ? "*" : "0123456789");
    }
    c.flags = format.substr(start + 1, i - start - 1);
    skip("hlqjztL");
    c.letter = i < format.size() ? format[i] : '\0';
    c.end = i < format.size() ? i + 1 : i;
    return c;
}

consteval void check(std::string_view format, std::span<const OVFormatKind> kinds) {
    std::size_t used = 0;
    auto take = [&](char letter) {
        if (used == kinds.size()) {
            formatHasMoreConversionsThanArguments();
        } else if (!fits(letter, kinds[used])) {
            formatConversionDoesNotFitItsArgument();
        }
        ++used;
    };
    for (std::size_t i = format.find('%'); i != std::string_view::npos; i = format.find('%', i)) {
        if (i + 1 < format.size() && format[i + 1] == '%') {
            i += 2;
            continue;
        }
        const Conversion c = readConversion(format, i);
        if (!isOneOf(c.letter, "diuxXocfFeEgGaAsp@")) formatHasAnUnknownConversion();
        if (c.starWidth) take('d');
        if (c.starPrecision) take('d');
        take(c.letter);
        i = c.end;
    }
    if (used < kinds.size()) formatHasFewerConversionsThanArguments();
}

}  // namespace OVFormatChecks

/// A format literal that fits arguments of the types `Args`.
template <class... Args>
class OVBasicFormatString {
 public:
    template <std::size_t N>
    consteval OVBasicFormatString(const char (&format)[N]) : mText(format) {
        constexpr OVFormatKind kinds[sizeof...(Args) + 1] = {
            OVFormatTraits<std::remove_cvref_t<Args>>::kind..., OVFormatKind::Object};
        OVFormatChecks::check({format, N - 1}, {kinds, sizeof...(Args)});
    }

    const char* text() const { return mText; }

 private:
    const char* mText;
};

/// The parameter type of a formatting function: keeps the format out of template deduction.
template <class... Args>
using OVFormatString = OVBasicFormatString<std::type_identity_t<Args>...>;
