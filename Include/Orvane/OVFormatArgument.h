#pragma once

#include <concepts>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <type_traits>

/// What a format can print, and how the types of an application join: see `OVFormat.h`.

/// What an argument can be printed as.
enum class OVFormatKind : std::uint8_t { Signed, Unsigned, Floating, Text, Pointer, Object };

/// One argument of a format: a small value that refers to the caller's argument and must not
/// outlive the call that it is made for.
class OVFormatArgument {
 public:
    /// Gives an object's text for `%@`. May return any text; must not keep the pointer.
    using Describe = std::string (*)(const void* object);

    /// Of a number or a text.
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

    /// Which of the following it has.
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
