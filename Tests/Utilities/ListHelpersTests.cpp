#include "Utilities/ListHelpers.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Foundation/String.h"

#include <gtest/gtest.h>

using namespace Foundation;
using namespace Orvane;

namespace {

/// Owned by the test's pool.
String* text(const char* utf8) {
    return String::string(utf8);
}

}  // namespace

TEST(ListHelpers, FindTheVeryObjectOnly) {
    const AutoreleasePool pool;
    const Ref<String> a = text("a");
    const Ref<String> equal = text("a");
    const Ref<ArrayOf<String>> list = ArrayOf<String>::array({a, nullptr});
    EXPECT_TRUE(ov_containsObjectIdenticalTo(list.get(), a.get()));
    EXPECT_FALSE(ov_containsObjectIdenticalTo(list.get(), equal.get()));
    EXPECT_TRUE(ov_containsObjectIdenticalTo<String>(list, nullptr));
    EXPECT_FALSE(ov_containsObjectIdenticalTo<String>(nullptr, a));
}

TEST(ListHelpers, MakeAListOfTheResults) {
    const AutoreleasePool pool;
    const Ref<ArrayOf<String>> list = ArrayOf<String>::array({text("a"), text("b")});
    const auto upper = [](String* s) { return s->getUpperCaseString(); };
    const Ref<ArrayOf<String>> uppers = ov_arrayByApplyingSelector(list.get(), upper);
    EXPECT_EQ(Ref<String>(uppers->toString())->utf8(), "(A, B)");
    EXPECT_EQ(Ref<String>(list->toString())->utf8(), "(a, b)");

    const auto append = [](String* s, const String* t) { return s->getStringByAppendingString(t); };
    const Ref<String> mark = text("!");
    const Ref<ArrayOf<String>> marked =
        ov_arrayByApplyingSelector(list.get(), append, static_cast<const String*>(mark));
    EXPECT_EQ(Ref<String>(marked->toString())->utf8(), "(a!, b!)");
    EXPECT_EQ(Ref<ArrayOf<String>>(ov_arrayByApplyingSelector<String>(nullptr, upper)).get(),
              nullptr);
}

TEST(ListHelpers, TakeOperationsOfAnyResult) {
    const AutoreleasePool pool;
    const Ref<ArrayOf<String>> list = ArrayOf<String>::array({text("ab")});
    const auto same = [](String* s) { return s; };
    const auto held = [](String* s) { return Ref<String>(s); };
    EXPECT_EQ(Ref<ArrayOf<String>>(ov_arrayByApplyingSelector(list.get(), same))->at(0),
              list->at(0));
    EXPECT_EQ(Ref<ArrayOf<String>>(ov_arrayByApplyingSelector(list.get(), held))->at(0),
              list->at(0));
    const Ref<ArrayOf<Data>> bytes =
        ov_arrayByApplyingSelector(list.get(), [](String* s) { return s->getData(); });
    EXPECT_EQ(bytes->at(0)->getLength(), 2u);
}

TEST(ListHelpers, ReplaceElementsInPlace) {
    const AutoreleasePool pool;
    const Ref<MutableArrayOf<String>> list =
        MutableArrayOf<String>::array({text("ax"), text("by")});
    ov_applySelector(list.get(), [](String* s) { return s->getUpperCaseString(); });
    EXPECT_EQ(Ref<String>(list->toString())->utf8(), "(AX, BY)");
    ov_applySelector(
        list.get(), [](String* s, int n) { return s->getSubstring(static_cast<std::size_t>(n)); },
        1);
    EXPECT_EQ(Ref<String>(list->toString())->utf8(), "(X, Y)");
    ov_applySelector<String>(nullptr, [](String* s) { return s; });
}
