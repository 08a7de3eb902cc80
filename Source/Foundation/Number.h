#pragma once

#include "Foundation/PFRefCounted.h"
#include "Foundation/Returner.h"

#include <concepts>
#include <cstddef>
#include <cstdint>

namespace Foundation {

/// A truth value, an integer or a real number. Immutable; knows which of them it was made from.
class Number final : public PFRefCounted {
 public:
    enum class Kind { Bool, Integer, Real };

    static Returner<Number> number(std::same_as<bool> auto value) {
        return Returner<Number>(new Number(Kind::Bool, value ? 1 : 0));
    }
    static Returner<Number> number(std::signed_integral auto value) { return integerNumber(value); }
    /// Throws `AssertionFailure` for a value that 64 bits with a sign cannot hold.
    static Returner<Number> number(std::unsigned_integral auto value) requires(
        !std::same_as<decltype(value), bool>) {
        return unsignedNumber(value);
    }
    static Returner<Number> number(std::floating_point auto value) {
        return Returner<Number>(new Number(static_cast<double>(value)));
    }

    Kind getKind() const { return mKind; }

    /// Whether the value is not 0.
    bool getBool() const;
    /// The integer, a real number cut towards 0 and to the range. What is not a number is 0.
    std::int64_t getInteger() const;
    double getReal() const;
    /// The same for numbers that may be null, which count as 0.
    static bool getBool(const Number* number) { return number && number->getBool(); }
    static std::int64_t getInteger(const Number* number) {
        return number ? number->getInteger() : 0;
    }
    static double getReal(const Number* number) { return number ? number->getReal() : 0.0; }

    std::size_t getHash() const override;
    /// Whether the two stand for the same value, whatever their kinds: true equals 1 and 1.0.
    bool isEqual(const PFRefCounted* other) const override;
    /// "1", "42" or "0.5": the shortest decimal form that reads back as the same value.
    StringReturner toString() const override;

 private:
    Number(Kind kind, std::int64_t value) : mKind(kind), mInteger(value) {}
    explicit Number(double value) : mKind(Kind::Real), mReal(value) {}
    static Returner<Number> integerNumber(std::int64_t value);
    static Returner<Number> unsignedNumber(std::uint64_t value);
    bool isInteger() const;

    Kind mKind;
    union {
        std::int64_t mInteger;  ///< for the kinds Bool and Integer
        double mReal;
    };
};

}  // namespace Foundation
