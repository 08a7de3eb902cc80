#include "Foundation/Number.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/String.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

using namespace Foundation;

namespace {

Ref<Number> make(auto value) {
    return Number::number(value);
}

}  // namespace

TEST(Number, KeepsTheKindItWasMadeFrom) {
    EXPECT_EQ(make(true)->getKind(), Number::Kind::Bool);
    EXPECT_EQ(make(1)->getKind(), Number::Kind::Integer);
    EXPECT_EQ(make(1u)->getKind(), Number::Kind::Integer);
    EXPECT_EQ(make(1.0)->getKind(), Number::Kind::Real);
    EXPECT_EQ(make(1.0f)->getKind(), Number::Kind::Real);
}

TEST(Number, GivesItsValueInEveryKind) {
    EXPECT_EQ(make(INT64_MIN)->getInteger(), INT64_MIN);
    EXPECT_EQ(make(true)->getInteger(), 1);
    EXPECT_EQ(make(-2.9)->getInteger(), -2);
    EXPECT_EQ(make(3)->getReal(), 3.0);
    EXPECT_EQ(make(0.25)->getReal(), 0.25);
    EXPECT_TRUE(make(0.25)->getBool());
    EXPECT_FALSE(make(0)->getBool());
    EXPECT_FALSE(make(false)->getBool());
}

TEST(Number, CutsRealsThatNoIntegerHolds) {
    EXPECT_EQ(make(1e300)->getInteger(), INT64_MAX);
    EXPECT_EQ(make(9223372036854775808.0)->getInteger(), INT64_MAX);
    EXPECT_EQ(make(-1e300)->getInteger(), INT64_MIN);
    EXPECT_EQ(make(std::nan(""))->getInteger(), 0);
}

TEST(Number, RefusesIntegersThatDoNotFit) {
    const Support::LogCapture log;
    EXPECT_EQ(make(std::uint64_t{INT64_MAX})->getInteger(), INT64_MAX);
    EXPECT_THROW(make(std::uint64_t{INT64_MAX} + 1), AssertionFailure);
}

TEST(Number, EqualsByValueAcrossKinds) {
    const auto isSame = [](const Ref<Number>& a, const Ref<Number>& b) {
        EXPECT_EQ(a->isEqual(b), b->isEqual(a));
        if (!a->isEqual(b)) return false;
        EXPECT_EQ(a->getHash(), b->getHash());
        return true;
    };
    EXPECT_TRUE(isSame(make(1), make(1)));
    EXPECT_TRUE(isSame(make(true), make(1)));
    EXPECT_TRUE(isSame(make(1), make(1.0)));
    EXPECT_TRUE(isSame(make(0.0), make(-0.0)));
    EXPECT_TRUE(isSame(make(std::nan("")), make(std::nan(""))));
    EXPECT_FALSE(isSame(make(1), make(2)));
    EXPECT_FALSE(isSame(make(1), make(1.5)));
    EXPECT_FALSE(make(1)->isEqual(nullptr));
    EXPECT_FALSE(make(1)->isEqual(Ref<String>(String::string("1")).get()));
}

TEST(Number, DoesNotEqualTheNearestRealOfALargeInteger) {
    const std::int64_t odd = (std::int64_t{1} << 53) + 1;
    EXPECT_FALSE(make(odd)->isEqual(make(static_cast<double>(odd)).get()));
    EXPECT_FALSE(make(INT64_MAX)->isEqual(make(9223372036854775808.0).get()));
}

TEST(Number, PrintsTheShortestForm) {
    EXPECT_EQ(OVFormat("%@ %@ %@", make(true), make(false), make(42)), "1 0 42");
    EXPECT_EQ(OVFormat("%@", make(INT64_MIN)), "-9223372036854775808");
    EXPECT_EQ(OVFormat("%@ %@ %@", make(0.5), make(0.1), make(3.0)), "0.5 0.1 3");
    EXPECT_EQ(OVFormat("%@", make(1e300)), "1e+300");
}

TEST(Number, NullCountsAsZero) {
    EXPECT_FALSE(Number::getBool(nullptr));
    EXPECT_EQ(Number::getInteger(nullptr), 0);
    EXPECT_EQ(Number::getReal(nullptr), 0.0);
    EXPECT_EQ(Number::getInteger(make(7).get()), 7);
}

TEST(Number, IsMadeOnceForACommonInteger) {
    const Ref<Number> first = Number::number(23);
    EXPECT_EQ(first.get(), Ref<Number>(Number::number(23)).get());
    EXPECT_EQ(first->getInteger(), 23);
    for (const long long other : {-1LL, 32LL, 1LL << 40}) {
        const Ref<Number> number = Number::number(other);
        EXPECT_EQ(number->getInteger(), other);
        EXPECT_NE(number.get(), Ref<Number>(Number::number(other)).get());
    }
}
