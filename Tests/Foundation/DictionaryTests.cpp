#include "Foundation/Dictionary.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/DictionaryOf.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/Number.h"
#include "Support/LogCapture.h"
#include "Tracked.h"

#include <gtest/gtest.h>

#include <map>
#include <random>

using namespace Foundation;

namespace {

/// A key whose hash is always the same.
class Colliding : public PFRefCounted {
 public:
    explicit Colliding(int number) : mNumber(number) {}
    std::size_t getHash() const override { return 5; }
    bool isEqual(const PFRefCounted* other) const override {
        const auto* key = dynamic_cast<const Colliding*>(other);
        return key && key->mNumber == mNumber;
    }

 private:
    int mNumber;
};

using Strings = MutableDictionaryOf<String, String>;

String* text(const std::string& utf8) {
    return String::string(utf8);
}
Number* number(int value) {
    return Number::number(value);
}

}  // namespace

TEST(Dictionary, GivesTheValueOfAnEqualKey) {
    const AutoreleasePool pool;
    const Ref<Strings> dictionary = Strings::dictionary({{text("a"), text("1")}});
    dictionary->set(text("b"), text("2"));
    dictionary->set("c", text("3"));
    EXPECT_EQ(dictionary->count(), 3u);
    EXPECT_EQ(dictionary->get(text("b"))->view(), "2");
    EXPECT_EQ(dictionary->get("a")->view(), "1");
    EXPECT_EQ(dictionary->get(text("c"))->view(), "3");
    EXPECT_EQ(dictionary->get("d"), nullptr);
    EXPECT_TRUE(dictionary->contains("a"));
    EXPECT_FALSE(dictionary->contains(text("d")));
}

TEST(Dictionary, TakesNullWhereItTakesAValue) {
    const AutoreleasePool pool;
    const Support::LogCapture log;
    const Ref<Strings> dictionary = Strings::dictionary({{text("a"), text("1")}});
    EXPECT_EQ(dictionary->get(static_cast<String*>(nullptr)), nullptr);
    EXPECT_FALSE(dictionary->contains(nullptr));
    dictionary->remove(nullptr);
    EXPECT_EQ(dictionary->count(), 1u);
    dictionary->set("a", nullptr);
    EXPECT_TRUE(dictionary->isEmpty());
    try {
        dictionary->set(static_cast<String*>(nullptr), text("1"));
        FAIL() << "a null key was taken";
    } catch (const AssertionFailure& failure) {
        EXPECT_STREQ(failure.what(), "key");
    }
}

TEST(Dictionary, KeepsTheOrderOfInsertion) {
    const AutoreleasePool pool;
    const Ref<Strings> dictionary = Strings::dictionary();
    for (const char* key : {"z", "a", "m", "b"}) {
        dictionary->set(key, text(key));
    }
    dictionary->set("a", text("again"));
    dictionary->remove(text("z"));
    dictionary->set("z", text("last"));
    EXPECT_EQ(OVFormat("%@", dictionary), "{a = again, m = m, b = b, z = last}");
}

TEST(Dictionary, WalksItsEntries) {
    const AutoreleasePool pool;
    const Ref<Strings> dictionary =
        Strings::dictionary({{text("a"), text("1")}, {text("b"), text("2")}});
    std::string walked;
    for (const auto [key, value] : *dictionary) {
        walked += key->utf8() + value->utf8();
    }
    EXPECT_EQ(walked, "a1b2");
    const Dictionary& untyped = *dictionary;
    for (const auto [key, value] : untyped) {
        EXPECT_EQ(untyped.get(key), value);
    }
}

TEST(Dictionary, AllowsRemovalsOnTheWalk) {
    const AutoreleasePool pool;
    const Ref<Strings> dictionary = Strings::dictionary();
    for (int i = 0; i < 40; ++i) {
        dictionary->set(std::to_string(i), text("x"));
    }
    int seen = 0;
    for (const auto [key, value] : *dictionary) {
        ++seen;
        dictionary->remove(key);
    }
    EXPECT_EQ(seen, 40);
    EXPECT_TRUE(dictionary->isEmpty());
    EXPECT_EQ(OVFormat("%@", dictionary), "{}");
}

TEST(Dictionary, HoldsObjectsOfBothKinds) {
    const AutoreleasePool pool;
    Deaths deaths;
    {
        const Ref<TrackedObject> object = new TrackedObject("x", &deaths);
        const auto dictionary = Ref<MutableDictionaryOf<String, TrackedObject>>(
            MutableDictionaryOf<String, TrackedObject>::dictionary());
        dictionary->set("x", object);
        EXPECT_EQ(object->getRefCount(), 2u);
        EXPECT_EQ(dictionary->get("x"), object.get());
        const Dictionary& untyped = *dictionary;
        EXPECT_EQ(untyped.get("x"), nullptr);
        EXPECT_EQ(untyped.getAs<TrackedObject>("x"), object.get());
    }
    EXPECT_EQ(deaths, Deaths{"x"});
}

TEST(Dictionary, ReleasesAtOnceWhatItGivesUp) {
    const AutoreleasePool pool;
    Deaths deaths;
    const auto tracked = [&](const char* name) {
        return Returner<TrackedValue>(new TrackedValue(name, &deaths));
    };
    const auto dictionary = Ref<MutableDictionaryOf<String, TrackedValue>>(
        MutableDictionaryOf<String, TrackedValue>::dictionary());
    for (const char* name : {"a", "b", "c"}) {
        dictionary->set(name, tracked(name));
    }
    dictionary->set("a", tracked("a2"));
    EXPECT_EQ(deaths, Deaths{"a"});
    dictionary->remove(text("b"));
    EXPECT_EQ(deaths, (Deaths{"a", "b"}));
    dictionary->removeAll();
    EXPECT_EQ(deaths, (Deaths{"a", "b", "a2", "c"}));
}

TEST(Dictionary, EqualsWhateverItsOrderAndType) {
    const AutoreleasePool pool;
    const auto one =
        Ref<Dictionary>(Strings::dictionary({{text("a"), text("1")}, {text("b"), text("2")}}));
    const auto other = Ref<Dictionary>(MutableDictionary::dictionary(
        {{text("b"), text("2")}, {text("c"), text("3")}, {text("a"), text("1")}}));
    EXPECT_FALSE(one->isEqual(other));
    static_cast<MutableDictionary*>(other.get())->remove(text("c"));
    EXPECT_TRUE(one->isEqual(other));
    EXPECT_TRUE(other->isEqual(one));
    EXPECT_EQ(one->getHash(), other->getHash());
    static_cast<MutableDictionary*>(other.get())->set("a", text("9"));
    EXPECT_FALSE(one->isEqual(other));
    EXPECT_FALSE(one->isEqual(nullptr));
    EXPECT_FALSE(one->isEqual(text("a")));
}

TEST(Dictionary, GivesValuesOfTheWantedTypeOnly) {
    const AutoreleasePool pool;
    const auto dictionary =
        Ref<Dictionary>(MutableDictionary::dictionary({{text("n"), number(3)}}));
    EXPECT_EQ(dictionary->getAs<Number>("n")->getInteger(), 3);
    EXPECT_EQ(dictionary->getAs<String>("n"), nullptr);
    EXPECT_EQ(dictionary->getAs<Number>(text("n")), dictionary->get("n"));
}

TEST(Dictionary, FindsKeysOfOneHash) {
    const AutoreleasePool pool;
    const auto dictionary = Ref<MutableDictionaryOf<Colliding, Number>>(
        MutableDictionaryOf<Colliding, Number>::dictionary());
    const auto key = [](int i) -> Colliding* { return Returner<Colliding>(new Colliding(i)); };
    for (int i = 0; i < 50; ++i) {
        dictionary->set(key(i), number(i));
    }
    for (int i = 0; i < 50; i += 2) {
        dictionary->remove(key(i));
    }
    for (int i = 0; i < 50; ++i) {
        EXPECT_EQ(Number::getInteger(dictionary->get(key(i))), i % 2 ? i : 0);
    }
}

TEST(Dictionary, AgreesWithAMapAfterManyChanges) {
    const AutoreleasePool pool;
    constexpr unsigned kSeed = 20240521;
    SCOPED_TRACE(kSeed);
    std::mt19937 random(kSeed);
    const auto dictionary =
        Ref<MutableDictionaryOf<Number, Number>>(MutableDictionaryOf<Number, Number>::dictionary());
    std::map<int, int> expected;
    for (int step = 0; step < 20000; ++step) {
        const AutoreleasePool stepPool;
        const int key = static_cast<int>(random() % 200);
        if (random() % 2) {
            dictionary->set(number(key), number(step));
            expected[key] = step;
        } else {
            dictionary->remove(number(key));
            expected.erase(key);
        }
        ASSERT_EQ(dictionary->count(), expected.size());
    }
    std::map<int, int> actual;
    for (const auto [key, value] : *dictionary) {
        actual[static_cast<int>(key->getInteger())] = static_cast<int>(value->getInteger());
    }
    EXPECT_EQ(actual, expected);
    for (const auto& [key, value] : expected) {
        EXPECT_EQ(Number::getInteger(dictionary->get(number(key))), value);
    }
}
