#include "Foundation/ArrayOf.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/Number.h"
#include "Foundation/String.h"
#include "Support/LogCapture.h"
#include "Tracked.h"

#include <gtest/gtest.h>

using namespace Foundation;

namespace {

String* text(const char* utf8) {
    return String::string(utf8);
}

}  // namespace

TEST(ArrayOf, HoldsItsElementsInOrder) {
    const AutoreleasePool pool;
    String* a = text("a");
    String* b = text("b");
    String* c = text("c");
    const Ref<ArrayOf<String>> array = ArrayOf<String>::array({b, a, c});
    EXPECT_EQ(array->count(), 3u);
    EXPECT_EQ(array->at(0), b);
    EXPECT_EQ(array->at(2), c);
    EXPECT_EQ(array->first(), b);
    EXPECT_EQ(array->last(), c);
    std::vector<String*> walked(array->begin(), array->end());
    EXPECT_EQ(walked, (std::vector<String*>{b, a, c}));
}

TEST(ArrayOf, MayBeEmpty) {
    const AutoreleasePool pool;
    const Ref<ArrayOf<String>> array = ArrayOf<String>::array();
    EXPECT_TRUE(array->isEmpty());
    EXPECT_EQ(array->first(), nullptr);
    EXPECT_EQ(array->last(), nullptr);
    EXPECT_EQ(array->begin(), array->end());
    EXPECT_EQ(OVFormat("%@", array), "()");
}

TEST(ArrayOf, RetainsValuesUntilItEnds) {
    const AutoreleasePool pool;
    Deaths deaths;
    {
        Ref<MutableArrayOf<TrackedValue>> array = MutableArrayOf<TrackedValue>::array();
        for (const char* name : {"x", "y"}) {
            array->add(Returner<TrackedValue>(new TrackedValue(name, &deaths)));
        }
        EXPECT_EQ(deaths, Deaths());
    }
    EXPECT_EQ(deaths, (Deaths{"x", "y"}));
}

TEST(ArrayOf, RetainsObjectsUntilItEnds) {
    const AutoreleasePool pool;
    Deaths deaths;
    {
        const Ref<TrackedObject> object = new TrackedObject("x", &deaths);
        Ref<ArrayOf<TrackedObject>> array = ArrayOf<TrackedObject>::array({object});
        EXPECT_EQ(object->getRefCount(), 2u);
        EXPECT_EQ(array->at(0), object.get());
        EXPECT_EQ(array->getAs<RefCounted>(0), object.get());
        EXPECT_EQ(array->getAs<PFRefCounted>(0), nullptr);
    }
    EXPECT_EQ(deaths, Deaths{"x"});
}

TEST(ArrayOf, MayHoldNull) {
    const AutoreleasePool pool;
    String* a = text("a");
    const Ref<ArrayOf<String>> array = ArrayOf<String>::array({nullptr, a});
    EXPECT_EQ(array->at(0), nullptr);
    EXPECT_EQ(array->indexOf(nullptr), 0u);
    EXPECT_EQ(OVFormat("%@", array), "((null), a)");
}

TEST(ArrayOf, IsMadeFromAnyRange) {
    const AutoreleasePool pool;
    String* a = text("a");
    String* b = text("b");
    const std::vector<Ref<String>> list{Ref<String>(a), Ref<String>(b)};
    EXPECT_EQ(OVFormat("%@", Ref<ArrayOf<String>>(ArrayOf<String>::arrayFrom(list))), "(a, b)");
    const Ref<ArrayOf<String>> array = ArrayOf<String>::array({b, nullptr});
    const Ref<MutableArrayOf<String>> copy = MutableArrayOf<String>::arrayFrom(*array);
    EXPECT_TRUE(copy->isEqual(array));
}

TEST(ArrayOf, FindsEqualElements) {
    const AutoreleasePool pool;
    String* a = text("a");
    String* b = text("b");
    String* c = text("c");
    const Ref<ArrayOf<String>> array = ArrayOf<String>::array({a, b, b});
    EXPECT_EQ(array->indexOf(text("b")), 1u);
    EXPECT_EQ(array->indexOf(c), std::nullopt);
    EXPECT_TRUE(array->contains(text("a")));
    EXPECT_FALSE(array->contains(nullptr));
}

TEST(ArrayOf, EqualsByElementsWhateverItsType) {
    const AutoreleasePool pool;
    String* a = text("a");
    String* b = text("b");
    const Ref<ArrayOf<String>> array = ArrayOf<String>::array({a, b});
    const Ref<ArrayOf<PFRefCounted>> untyped =
        MutableArrayOf<PFRefCounted>::array({text("a"), text("b")});
    EXPECT_TRUE(array->isEqual(untyped));
    EXPECT_EQ(array->getHash(), untyped->getHash());
    EXPECT_FALSE(array->isEqual(Ref<Array>(ArrayOf<String>::array({b, a})).get()));
    EXPECT_FALSE(array->isEqual(Ref<Array>(ArrayOf<String>::array({a})).get()));
    EXPECT_FALSE(array->isEqual(a));
    EXPECT_FALSE(array->isEqual(nullptr));
}

TEST(ArrayOf, GivesElementsOfTheWantedTypeOnly) {
    const AutoreleasePool pool;
    String* a = text("a");
    const Ref<ArrayOf<PFRefCounted>> array =
        ArrayOf<PFRefCounted>::array({a, static_cast<Number*>(Number::number(2))});
    EXPECT_EQ(array->getAs<String>(0), a);
    EXPECT_EQ(array->getAs<String>(1), nullptr);
    EXPECT_EQ(array->getAs<Number>(1)->getInteger(), 2);
}

TEST(ArrayOf, RefusesAnIndexBehindTheEnd) {
    const AutoreleasePool pool;
    String* a = text("a");
    String* b = text("b");
    const Support::LogCapture log;
    const Ref<MutableArrayOf<String>> array = MutableArrayOf<String>::array({a});
    EXPECT_THROW(array->at(1), AssertionFailure);
    EXPECT_THROW(array->getAs<String>(1), AssertionFailure);
    EXPECT_THROW(array->set(1, b), AssertionFailure);
    EXPECT_THROW(array->remove(1), AssertionFailure);
    EXPECT_THROW(array->insert(2, b), AssertionFailure);
    EXPECT_EQ(array->count(), 1u);
}

TEST(ArrayOf, ChangesWhenMutable) {
    const AutoreleasePool pool;
    String* a = text("a");
    String* b = text("b");
    String* c = text("c");
    const Ref<MutableArrayOf<String>> array = MutableArrayOf<String>::array({b});
    array->insert(0, a);
    array->insert(2, c);
    EXPECT_EQ(OVFormat("%@", array), "(a, b, c)");
    array->set(1, c);
    array->remove(0);
    EXPECT_EQ(OVFormat("%@", array), "(c, c)");
    array->addAll(array);
    array->addAll(nullptr);
    EXPECT_EQ(array->count(), 4u);
    array->removeAll();
    EXPECT_TRUE(array->isEmpty());
}

TEST(ArrayOf, ReleasesAtOnceWhatItGivesUp) {
    const AutoreleasePool pool;
    Deaths deaths;
    const auto tracked = [&](const char* name) {
        return Returner<TrackedValue>(new TrackedValue(name, &deaths));
    };
    const Ref<MutableArrayOf<TrackedValue>> array = MutableArrayOf<TrackedValue>::array();
    array->add(tracked("x"));
    array->add(tracked("y"));
    {
        const Ref<TrackedValue> z = tracked("z");
        array->set(0, z);
    }
    EXPECT_EQ(deaths, Deaths{"x"});
    array->remove(1);
    EXPECT_EQ(deaths, (Deaths{"x", "y"}));
    array->removeAll();
    EXPECT_EQ(deaths, (Deaths{"x", "y", "z"}));
}

TEST(ArrayOf, SortsAndKeepsTheOrderOfEqualElements) {
    const AutoreleasePool pool;
    String* a = text("a");
    String* b = text("b");
    String* c = text("c");
    String* a2 = text("a");
    const Ref<MutableArrayOf<String>> array = MutableArrayOf<String>::array({c, a, b, a2});
    array->sort([](const String* x, const String* y) { return x->view() < y->view(); });
    EXPECT_EQ(OVFormat("%@", array), "(a, a, b, c)");
    EXPECT_EQ(array->at(0), a);
    EXPECT_EQ(array->at(1), a2);
}
