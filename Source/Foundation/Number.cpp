#include "Foundation/Number.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"

#include <fmt/format.h>
#include <array>
#include <cmath>
#include <functional>
#include <limits>

namespace Foundation {

namespace {

/// 2 to the power of 63: the first real number behind the integers.
constexpr double kEndOfIntegers = 9223372036854775808.0;

}  // namespace

Returner<Number> Number::integerNumber(std::int64_t value) {
    // Codes and counts, which come again and again, are made once. Never destroyed, as what ends
    // with the process may still use them.
    constexpr std::size_t kKept = 32;
    static auto& sKept = *new std::array<Ref<Number>, kKept>;
    if (value < 0 || value >= std::int64_t{kKept}) {
        return Returner<Number>(new Number(Kind::Integer, value));
    }
    Ref<Number>& number = sKept[static_cast<std::size_t>(value)];
    if (!number) number = Returner<Number>(new Number(Kind::Integer, value));
    return Returner<Number>(number);
}

Returner<Number> Number::unsignedNumber(std::uint64_t value) {
    OV_ASSERT_MESSAGE(value <= INT64_MAX, "%llu does not fit a number", value);
    return integerNumber(static_cast<std::int64_t>(value));
}

bool Number::getBool() const {
    return mKind == Kind::Real ? mReal != 0 : mInteger != 0;
}

std::int64_t Number::getInteger() const {
    if (mKind != Kind::Real) return mInteger;
    if (std::isnan(mReal)) return 0;
    if (mReal >= kEndOfIntegers) return INT64_MAX;
    if (mReal < -kEndOfIntegers) return INT64_MIN;
    return static_cast<std::int64_t>(mReal);
}

double Number::getReal() const {
    return mKind == Kind::Real ? mReal : static_cast<double>(mInteger);
}

bool Number::isInteger() const {
    if (mKind != Kind::Real) return true;
    return mReal == std::floor(mReal) && mReal >= -kEndOfIntegers && mReal < kEndOfIntegers;
}

std::size_t Number::getHash() const {
    return isInteger() ? std::hash<std::int64_t>()(getInteger()) : std::hash<double>()(mReal);
}

bool Number::isEqual(const PFRefCounted* other) const {
    const auto* number = dynamic_cast<const Number*>(other);
    if (!number || isInteger() != number->isInteger()) return false;
    if (isInteger()) return getInteger() == number->getInteger();
    // As a key or an element, what is not a number must be found again.
    return mReal == number->mReal || (std::isnan(mReal) && std::isnan(number->mReal));
}

StringReturner Number::toString() const {
    return String::string(mKind == Kind::Real ? fmt::format("{}", mReal)
                                              : std::to_string(mInteger));
}

}  // namespace Foundation
