#pragma once

#include <Orvane/OVBase.h>

#include <concepts>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <type_traits>

/// printf-style formats, checked against their arguments when they are compiled.
///
/// The conversions are those of ISO C's printf without `n`, and `%@`, which takes an object and
/// prints its description. Length modifiers are accepted and ignored: the argument's own type
/// tells its size, so no value is ever cut or misread. Numbers print as in the C locale.
///
/// A function that formats takes `OVFormatString<Args...>` and `const Args&...`. A string literal
/// whose conversions do not fit the arguments does not compile.

/// What an argument can be printed as.
enum class OVFormatKind : std::uint8_t { Signed, Unsigned, Floating, Text, Pointer, Object };

/// One argument of a format: a small value that refers to the caller's argument and must not
/// outlive the call that it is made for.
class OVFormatArgument {
 public:
    /// Gives an object's text for `%@`. May return any text; must not keep the pointer.
    using Describe = std::string (*)(const void* object);

    OVFormatArgument(std::signed_integral auto value)
        : mKind(OVFormatKind::Signed), mSigned(value) {}
    OVFormatArgument(std::unsigned_integral auto value)
        : mKind(OVFormatKind::Unsigned), mUnsigned(value) {}
    OVFormatArgument(std::floating_point auto value)
        : mKind(OVFormatKind::Floating), mFloating(static_cast<double>(value)) {}
    OVFormatArgument(std::string_view text) : mKind(OVFormatKind::Text), mText(text) {}
    OVFormatArgument(const std::string& text) : OVFormatArgument(std::string_view(text)) {}
    /// A null text prints as "(null)".
    OVFormatArgument(const char* text)
        : OVFormatArgument(std::string_view(text ? text : "(null)")) {}
    OVFormatArgument(const void* pointer)
        : mKind(OVFormatKind::Pointer), mObject{pointer, nullptr} {}
    OVFormatArgument(std::nullptr_t) : OVFormatArgument(static_cast<const void*>(nullptr)) {}
    /// An object prints by `describe` for `%@` and as its address for `%p`; null is "(null)".
    OVFormatArgument(const void* object, Describe describe)
        : mKind(OVFormatKind::Object), mObject{object, describe} {}

    OVFormatKind kind() const { return mKind; }
    std::int64_t signedValue() const { return mSigned; }
    std::uint64_t unsignedValue() const { return mUnsigned; }
    double floatingValue() const { return mFloating; }
    std::string_view text() const { return mText; }
    const void* pointer() const { return mObject.pointer; }
    /// The object's description. REQUIRES: `kind()` is Object.
    std::string description() const {
        return mObject.pointer ? mObject.describe(mObject.pointer) : std::string("(null)");
    }

 private:
    struct ObjectValue {
        const void* pointer;
        Describe describe;
    };

    OVFormatKind mKind;
    union {
        std::int64_t mSigned;
        std::uint64_t mUnsigned;
        double mFloating;
        std::string_view mText;
        ObjectValue mObject;
    };
};

/// Specialise for a type that is to be an argument: `kind`, a constant, and
/// `make(const T&)`, which gives the `OVFormatArgument`.
template <class T>
struct OVFormatTraits;

template <class T>
requires std::is_arithmetic_v<T> ||
    (std::is_enum_v<T>&& std::is_convertible_v<T, long long>)struct OVFormatTraits<T> {
    static constexpr OVFormatKind kind = std::is_floating_point_v<T> ? OVFormatKind::Floating
                                         : std::is_signed_v<T>       ? OVFormatKind::Signed
                                                                     : OVFormatKind::Unsigned;
    static OVFormatArgument make(const T& value) {
        if constexpr (std::is_enum_v<T>) {
            return static_cast<std::underlying_type_t<T>>(value);
        } else if constexpr (std::is_same_v<T, bool>) {
            return static_cast<unsigned>(value);
        } else {
            return value;
        }
    }
};

template <class T>
requires std::is_convertible_v<const T&, std::string_view> ||
    std::is_convertible_v<const T&, const char*>
struct OVFormatTraits<T> {
    static constexpr OVFormatKind kind = OVFormatKind::Text;
    static OVFormatArgument make(const T& value) {
        if constexpr (std::is_convertible_v<const T&, const char*>) {
            return static_cast<const char*>(value);
        } else {
            return static_cast<std::string_view>(value);
        }
    }
};

/// A class whose objects are arguments of `%@`: in its namespace or that of a base stands
/// `std::string describeForFormat(const Class*)`.
template <class T>
concept OVFormatObject = requires(const T* object) {
    { describeForFormat(object) } -> std::same_as<std::string>;
};

/// The same, and refuses classes that are only declared: they would be taken for plain addresses.
template <class T>
constexpr bool OVIsFormatObject() {
    if constexpr (std::is_class_v<std::remove_cv_t<T>>) {
        static_assert(
            requires { sizeof(T); }, "a class must be defined where it is formatted");
        return OVFormatObject<T>;
    }
    return false;
}

template <class T>
requires(!std::is_convertible_v<T*, const char*>) struct OVFormatTraits<T*> {
    static constexpr OVFormatKind kind =
        OVIsFormatObject<T>() ? OVFormatKind::Object : OVFormatKind::Pointer;
    static OVFormatArgument make(T* value) {
        const auto* pointer = reinterpret_cast<const void*>(value);
        if constexpr (kind == OVFormatKind::Object) {
            return {pointer, [](const void* object) {
                        return describeForFormat(static_cast<const T*>(object));
                    }};
        } else {
            return pointer;
        }
    }
};

template <>
struct OVFormatTraits<std::nullptr_t> {
    static constexpr OVFormatKind kind = OVFormatKind::Object;
    static OVFormatArgument make(std::nullptr_t) { return {nullptr, nullptr}; }
};

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

/// Formats `format` with `arguments`. For formats that are known only at run time, such as
/// translated ones: a conversion that has no argument or one of another kind prints as it stands
/// in the format, and no argument is ever read as what it is not.
OV_EXPORT std::string OVFormatV(std::string_view format,
                                std::span<const OVFormatArgument> arguments);

/// Calls `function` with the arguments as an array of `OVFormatArgument`, which lives for the call.
template <class Function, class... Args>
decltype(auto) OVWithFormatArguments(Function&& function, const Args&... arguments) {
    if constexpr (sizeof...(Args) == 0) {
        return function(std::span<const OVFormatArgument>());
    } else {
        const OVFormatArgument list[] = {OVFormatTraits<Args>::make(arguments)...};
        return function(std::span<const OVFormatArgument>(list));
    }
}

/// The text that `format` gives with `arguments`.
template <class... Args>
std::string OVFormat(OVFormatString<Args...> format, const Args&... arguments) {
    return OVWithFormatArguments(
        [&](std::span<const OVFormatArgument> list) { return OVFormatV(format.text(), list); },
        arguments...);
}
