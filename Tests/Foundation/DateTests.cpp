#include "Foundation/Date.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/String.h"
#include "Support/ManualClock.h"

#include <gtest/gtest.h>

#include <limits>

using namespace Foundation;
using Support::ManualClock;

TEST(Date, OfZeroIsNull) {
    EXPECT_EQ(Ref<Date>(Date::date(0.0)).get(), nullptr);
    EXPECT_EQ(Ref<Date>(Date::date(-0.0)).get(), nullptr);
    EXPECT_EQ(Ref<Date>(Date::date(std::numeric_limits<double>::quiet_NaN())).get(), nullptr);
}

TEST(Date, KeepsItsAbsoluteTime) {
    const Ref<Date> date = Date::date(151546354.25);
    EXPECT_EQ(date->getAbsoluteTime(), 151546354.25);
    EXPECT_EQ(Date::getAbsoluteTime(date), 151546354.25);
    EXPECT_EQ(Date::getAbsoluteTime(nullptr), 0.0);
}

TEST(Date, NowIsTheProcessClocks) {
    const ManualClock clock(1000);
    EXPECT_EQ(Ref<Date>(Date::now())->getAbsoluteTime(), 1000);
    EXPECT_EQ(Ref<Date>(Date::nowPlus(30.5))->getAbsoluteTime(), 1030.5);
    EXPECT_EQ(Ref<Date>(Date::nowPlus(-1000)).get(), nullptr);
}

TEST(Date, AddsTime) {
    const Ref<Date> date = Date::date(100);
    EXPECT_EQ(Ref<Date>(date->addTime(20))->getAbsoluteTime(), 120);
    EXPECT_EQ(Ref<Date>(date->addTime(-120))->getAbsoluteTime(), -20);
    EXPECT_EQ(Ref<Date>(date->addTime(-100)).get(), nullptr);
    EXPECT_EQ(date->getAbsoluteTime(), 100);
}

TEST(Date, TellsHowLongAgoItWas) {
    const ManualClock clock(1000);
    EXPECT_EQ(Ref<Date>(Date::date(400))->getTimeAgo(), 600);
    EXPECT_EQ(Ref<Date>(Date::date(1500))->getTimeAgo(), -500);
}

TEST(Date, NullIsAsLongAgoAsTheStartOfTheCount) {
    const ManualClock clock(1000);
    EXPECT_EQ(Date::getTimeAgo(nullptr), 1000);
}

TEST(Date, EqualsByTime) {
    const Ref<Date> a = Date::date(7.5);
    const Ref<Date> b = Date::date(7.5);
    const Ref<Date> c = Date::date(8);
    const Ref<String> text = String::string("7.5");
    EXPECT_TRUE(IsEqual(a.get(), b.get()));
    EXPECT_EQ(a->getHash(), b->getHash());
    EXPECT_FALSE(IsEqual(a.get(), c.get()));
    EXPECT_FALSE(a->isEqual(text));
    EXPECT_FALSE(a->isEqual(nullptr));
}

TEST(Date, ComparesByTime) {
    const Ref<Date> early = Date::date(-1);
    const Ref<Date> late = Date::date(1);
    EXPECT_EQ(early->compare(*late), -1);
    EXPECT_EQ(late->compare(*early), 1);
    EXPECT_EQ(late->compare(*late), 0);
}

TEST(Date, DescribesItselfInGMT) {
    const AutoreleasePool pool;
    EXPECT_EQ(OVFormat("%@", Ref<Date>(Date::date(151546354.75)).get()),
              "2005-10-21 00:12:34 +0000");
    EXPECT_EQ(OVFormat("%@", Ref<Date>(Date::date(-1)).get()), "2000-12-31 23:59:59 +0000");
}
