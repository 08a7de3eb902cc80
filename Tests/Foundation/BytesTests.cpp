#include "Foundation/Bytes.h"

#include "Foundation/AssertionFailure.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <functional>

using namespace Foundation;

namespace {

/// What the assertion says that `action` fails; empty if it does not.
std::string failureOf(const std::function<void()>& action) {
    const Support::LogCapture log;
    try {
        action();
    } catch (const AssertionFailure& failure) {
        return failure.what();
    }
    return "";
}

constexpr char kText[] = "abcdef";

}  // namespace

TEST(Bytes, ViewsWhatLiesBetweenItsEnds) {
    const Bytes bytes(kText, kText + 6);
    EXPECT_EQ(bytes.view(), "abcdef");
    EXPECT_EQ(bytes.getLength(), 6u);
    EXPECT_FALSE(bytes.isEmpty());
    EXPECT_TRUE(Bytes().isEmpty());
    EXPECT_EQ(Bytes(std::string_view("xy")).view(), "xy");
}

TEST(Bytes, RefusesEndsInTheWrongOrder) {
    EXPECT_EQ(failureOf([] { Bytes(kText + 1, kText); }), "begin<=end");
    EXPECT_EQ(failureOf([] { Bytes(kText, kText); }), "");
}

TEST(Bytes, MovesItsBeginningWithinItself) {
    Bytes bytes(kText + 1, kText + 5);
    bytes.setBegin(kText + 2);
    EXPECT_EQ(bytes.view(), "cde");
    EXPECT_EQ(failureOf([&] { bytes.setBegin(kText + 1); }), "begin>=mBegin");
    EXPECT_EQ(failureOf([&] { bytes.setBegin(kText + 6); }), "begin<=mEnd");
    EXPECT_EQ(failureOf([&] { bytes.setBegin(nullptr); }), "begin>=mBegin");
    bytes.addBegin(1);
    EXPECT_EQ(bytes.view(), "de");
    EXPECT_EQ(failureOf([&] { bytes.addBegin(3); }), "begin<=mEnd");
    EXPECT_EQ(failureOf([&] { bytes.addBegin(PTRDIFF_MAX); }), "begin<=mEnd");
    EXPECT_EQ(failureOf([&] { bytes.addBegin(-1); }), "begin>=mBegin");
    EXPECT_EQ(bytes.view(), "de");
    bytes.addBegin(2);
    EXPECT_TRUE(bytes.isEmpty());
}

TEST(Bytes, MovesItsEndWithinItself) {
    Bytes bytes(kText + 1, kText + 5);
    bytes.setEnd(kText + 4);
    EXPECT_EQ(bytes.view(), "bcd");
    EXPECT_EQ(failureOf([&] { bytes.setEnd(kText); }), "end>=mBegin");
    EXPECT_EQ(failureOf([&] { bytes.setEnd(kText + 5); }), "end<=mEnd");
    bytes.setEnd(kText + 1);
    EXPECT_TRUE(bytes.isEmpty());
}

TEST(Bytes, HaveNoBeginningToMoveWhereThereIsNoPlace) {
    Bytes none;
    EXPECT_EQ(failureOf([&] { none.setBegin(nullptr); }), "mBegin");
    EXPECT_EQ(failureOf([&] { none.addBegin(0); }), "mBegin");
}
