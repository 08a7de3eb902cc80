#include "FeedParser/EngineMap.h"

#include "FeedParser/MergeTest.h"
#include "Foundation/ArrayOf.h"
#include "Foundation/AssertionFailure.h"

using namespace Foundation;
using namespace Orvane;

namespace {

class EngineMapTest : public MergeTest {
 protected:
    static EntryCore* at(const FeedCore* parsed, std::size_t index) {
        return static_cast<EntryCore*>(parsed->mEntries.getNewRows()[index].get());
    }
    static std::string condition(const std::string& first, const std::string& second) {
        return "identifier in ('" + identifierOf(first) + "','" + identifierOf(second) + "')";
    }

    EngineMap map;
    FeedCore* const parsed = document({{"a", "One"}, {"b", "Two"}, {"c", "Three"}});
};

}  // namespace

TEST_F(EngineMapTest, FindsEntriesByIdentifierAndSource) {
    map.addEntries(parsed->getEntries(nullptr).allRows());
    EXPECT_EQ(map.count(), 3U);
    EXPECT_EQ(map.last(), at(parsed, 2));
    EXPECT_EQ(map.entryWithIdentifier(string(identifierOf("b"))), at(parsed, 1));
    EXPECT_EQ(map.entryWithHash(hashOf(sourceOf({"b", "Two"}))), at(parsed, 1));
    EXPECT_EQ(map.entryWithIdentifier(string("none")), nullptr);
    EXPECT_EQ(map.entryWithIdentifier(nullptr), nullptr);
    EXPECT_EQ(map.entryWithHash("none"), nullptr);
}

TEST_F(EngineMapTest, WritesAConditionInTheOrderOfTheDocument) {
    map.addEntry(at(parsed, 1));
    map.addEntry(at(parsed, 0));
    EXPECT_EQ(map.getIdentifiersSQL(), condition("b", "a"));
    map.addEntry(at(parsed, 2));
    map.removeEntry(at(parsed, 0));
    EXPECT_EQ(map.getIdentifiersSQL(), condition("b", "c"));
}

TEST_F(EngineMapTest, ForgetsWhatIsRemoved) {
    map.addEntries(parsed->getEntries(nullptr).allRows());
    map.removeEntry(nullptr);
    EXPECT_EQ(map.count(), 3U);
    map.removeEntry(at(parsed, 1));
    EXPECT_EQ(map.entryWithIdentifier(string(identifierOf("b"))), nullptr);
    EXPECT_EQ(map.entryWithHash(hashOf(sourceOf({"b", "Two"}))), nullptr);
    map.removeEntry(at(parsed, 1));
    map.removeEntry(at(parsed, 2));
    EXPECT_EQ(map.last(), at(parsed, 0));
    map.removeEntry(at(parsed, 0));
    EXPECT_TRUE(map.isEmpty());
    EXPECT_EQ(map.last(), nullptr);
}

TEST_F(EngineMapTest, DoesNotTakeAnotherForTheEntryThatIsRemoved) {
    const FeedCore* twins = document({{"a", "One"}, {"a", "Two"}});
    map.addEntries(twins->getEntries(nullptr).allRows());
    map.removeEntry(at(twins, 1));
    EXPECT_EQ(map.entryWithIdentifier(string(identifierOf("a"))), at(twins, 0));
}

TEST_F(EngineMapTest, DropsEntriesWithoutASource) {
    Post bare{"x", "Bare"};
    bare.hasSource = false;
    map.addEntry(at(document({bare}), 0));
    EXPECT_TRUE(map.isEmpty());
}

TEST_F(EngineMapTest, RefusesAnEntryThatCannotBeIdentified) {
    EntryCore* orphan = row<EntryCore>();
    orphan->setContentColumn("XMLRepresentation", nullptr, data("<item/>"));
    try {
        map.addEntry(orphan);
        FAIL();
    } catch (const AssertionFailure& failure) {
        EXPECT_STREQ(failure.what(), "entry identifier is null!");
    }
}
