#include "Foundation/AssertionFailure.h"
#include "SQLite/RowIterator.h"
#include "SQLite/StoreTest.h"

#include <stdexcept>

using namespace Foundation;
using namespace SQLite;
using Support::LogCapture;

namespace {

class RowIteratorTest : public StoreTest {
 protected:
    RowIteratorTest() { group->saveChanges(); }

    Item* addItem(const char* title) {
        const Ref<Item> item = Item::make(title);
        item->mOwner.setValue(group.get());
        group->mItems.add(item.get());
        return item.get();
    }
    static std::string titles(RowIterator<Item>& iterator) {
        std::string all;
        for (; iterator.hasRow(); iterator.nextRow()) {
            all += iterator->mTitle.getValue()->utf8();
        }
        return all;
    }

    const Ref<Group> group = Group::make("g");
};

}  // namespace

TEST_F(RowIteratorTest, WalksRowsOfTheFileAndThenUnsavedOnes) {
    addItem("a");
    addItem("b");
    group->saveChanges();
    addItem("d");
    addItem("c");
    saveItem("not of the group");
    RowIterator<Item> iterator(group->mItems);
    EXPECT_EQ(iterator.getIndex(), 1);
    EXPECT_EQ(titles(iterator), "abdc");
    EXPECT_EQ(iterator.getIndex(), 4);
    EXPECT_FALSE(iterator.nextRow());
    EXPECT_EQ(iterator.getRow(), nullptr);
}

TEST_F(RowIteratorTest, AppliesAConditionToRowsOfTheFile) {
    addItem("a");
    addItem("b");
    group->saveChanges();
    RowIterator<Item> iterator(group->mItems, "title='b' or title='c'");
    EXPECT_EQ(titles(iterator), "b");
}

TEST_F(RowIteratorTest, RefusesAConditionTogetherWithUnsavedRows) {
    addItem("a");
    try {
        const RowIterator<Item> iterator(group->mItems, "1");
        FAIL();
    } catch (const std::logic_error& error) {
        EXPECT_STREQ(error.what(), "Row iterator can't apply condition to unsaved rows");
    }
}

TEST_F(RowIteratorTest, OpensNoCursorForAnUnsavedOwner) {
    const Ref<Group> fresh = Group::make("new");
    RowIterator<Item> empty(fresh->mItems, "title='a'");
    EXPECT_FALSE(empty.hasRow());
    EXPECT_FALSE(empty.hasCursor());
    const Ref<Item> item = Item::make("a");
    fresh->mItems.add(item.get());
    RowIterator<Item> iterator(fresh->mItems);
    EXPECT_EQ(iterator.getRow(), item.get());
    EXPECT_FALSE(iterator.hasCursor());
}

TEST_F(RowIteratorTest, NeedsAKey) {
    const LogCapture log;
    for (const char* key : {"", static_cast<const char*>(nullptr)}) {
        try {
            const RowIterator<Item> iterator(items(), key, 1, nullptr, {});
            FAIL();
        } catch (const AssertionFailure& failure) {
            EXPECT_STREQ(failure.what(), "key && key[0]");
        }
    }
}

TEST_F(RowIteratorTest, CollectsWhatIsLeft) {
    addItem("a");
    addItem("b");
    group->saveChanges();
    Item* const last = addItem("c");
    RowIterator<Item> iterator(group->mItems);
    iterator.nextRow();
    const Ref<ArrayOf<Item>> rest = iterator.allRows();
    ASSERT_EQ(rest->count(), 2U);
    EXPECT_EQ(rest->at(1), last);
    EXPECT_FALSE(iterator.hasRow());
    RowIterator<Item> untyped(group->mItems);
    const Ref<ArrayOf<Row>> all = untyped._allRows();
    EXPECT_EQ(all->count(), 3U);
}

TEST_F(RowIteratorTest, WalksWithoutACursor) {
    const BasicRowIterator none(nullptr, {});
    EXPECT_FALSE(none.hasRow());
    EXPECT_EQ(none.getIndex(), 0);
}
