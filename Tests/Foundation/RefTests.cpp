#include "Foundation/Ref.h"

#include "Foundation/Counted.h"

#include <gtest/gtest.h>

using namespace Foundation;

namespace {

/// Two objects, `a` and `b`, and what was counted on them since the last look.
class RefTest : public testing::Test {
 protected:
    using Log = std::vector<std::string>;

    Log counts() { return std::exchange(mLog, {}); }

    Log mLog;
    Counted a{"a", &mLog};
    Counted b{"b", &mLog};
};

using Returned = Returner<Counted>;

}  // namespace

TEST_F(RefTest, RetainsOnceAndReleasesAtItsEnd) {
    {
        const Ref<Counted> ref(&a);
        EXPECT_EQ(ref.get(), &a);
        EXPECT_EQ(counts(), Log({"retain a"}));
    }
    EXPECT_EQ(counts(), Log({"release a"}));
}

TEST_F(RefTest, CountsEachCopy) {
    const Ref<Counted> ref(&a);
    counts();
    {
        const Ref<Counted> copy = ref;  // NOLINT: the copy is what is tested
        EXPECT_EQ(counts(), Log({"retain a"}));
    }
    EXPECT_EQ(counts(), Log({"release a"}));
}

TEST_F(RefTest, MovesWithoutACount) {
    Ref<Counted> ref(&a);
    counts();
    const Ref<Counted> moved = std::move(ref);
    EXPECT_EQ(ref.get(), nullptr);  // NOLINT: emptied by the move
    EXPECT_EQ(counts(), Log());
}

TEST_F(RefTest, AssignmentRetainsTheNewBeforeItAutoreleasesTheOld) {
    Ref<Counted> ref(&a);
    const Ref<Counted> other(&b);
    counts();
    ref = &b;
    EXPECT_EQ(counts(), Log({"retain b", "autorelease a"}));
    ref = other;
    EXPECT_EQ(counts(), Log());
    ref = nullptr;
    EXPECT_EQ(counts(), Log({"autorelease b"}));
    ref = other;
    EXPECT_EQ(counts(), Log({"retain b"}));
}

TEST_F(RefTest, MoveAssignmentAutoreleasesTheOldAndCountsNothingElse) {
    Ref<Counted> ref(&a);
    Ref<Counted> other(&b);
    counts();
    ref = std::move(other);
    EXPECT_EQ(counts(), Log({"autorelease a"}));
    EXPECT_EQ(ref.get(), &b);
}

TEST_F(RefTest, AssignmentFromAReturnerReleasesTheOldAtOnce) {
    Ref<Counted> ref(&a);
    counts();
    ref = Returned(&b);
    EXPECT_EQ(counts(), Log({"release a"}));
    ref = Returned(&b);
    EXPECT_EQ(counts(), Log({"release b"}));
}

TEST_F(RefTest, TakesAReturnersReferenceWithoutACount) {
    const Ref<Counted> ref = Returned(&a);
    EXPECT_EQ(counts(), Log());
    const Ref<Counted> null = Returned(nullptr);
    EXPECT_EQ(null.get(), nullptr);
}

TEST_F(RefTest, AReturnerBecomesAPlainPointerByAutorelease) {
    Returned returner(&a);
    Counted* plain = returner;
    EXPECT_EQ(plain, &a);
    EXPECT_EQ(counts(), Log({"autorelease a"}));
    Counted* again = returner;
    EXPECT_EQ(again, nullptr);
    EXPECT_EQ(counts(), Log());
}

TEST_F(RefTest, ADroppedReturnerReleases) {
    { const Returned returner(&a); }
    EXPECT_EQ(counts(), Log({"release a"}));
}

TEST_F(RefTest, AReturnerOfWhatOthersOwnRetains) {
    { const Returned returner = Returned::retained(&a); }
    EXPECT_EQ(counts(), Log({"retain a", "release a"}));
    Ref<Counted> ref(&a);
    counts();
    { const Returned returner = std::move(ref); }
    EXPECT_EQ(counts(), Log({"release a"}));
}

TEST_F(RefTest, TransferRefGivesTheNewAtOnceIfBothAreTheSame) {
    EXPECT_EQ(transferRef(&a, &a), &a);
    EXPECT_EQ(counts(), Log());
    EXPECT_EQ(transferRef<Counted>(nullptr, &a), &a);
    EXPECT_EQ(counts(), Log({"retain a"}));
    EXPECT_EQ(transferRef<Counted>(&a, nullptr), nullptr);
    EXPECT_EQ(counts(), Log({"autorelease a"}));
}

TEST_F(RefTest, TransferRefUnpooledReleasesTheOldAtOnce) {
    EXPECT_EQ(transferRefUnpooled(&a, &b), &b);
    EXPECT_EQ(counts(), Log({"retain b", "release a"}));
    EXPECT_EQ(transferRefUnpooled(&b, &b), &b);
    EXPECT_EQ(counts(), Log());
}
