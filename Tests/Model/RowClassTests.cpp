#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/TimeZone.h"
#include "Foundation/URL.h"
#include "Model/DeclaredColumns.h"
#include "Model/ModelTest.h"

#include <string>

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;

namespace {

/// A value of a column's type that no other position has, in its forms: `set` gives it to a
/// column, `has` compares a column with it, `hasRaw` what is in the file.
struct Sample {
    explicit Sample(int position) : n(position + 1) {}

    std::string text() const { return "text " + std::to_string(n); }
    std::string url() const { return "http://example.org/" + std::to_string(n); }
    double date() const { return 1000.5 + n; }
    // Booleans can only take turns.
    bool flag() const { return n % 2 != 0; }
    RowID rowID() const { return 5000000000 + n; }

    void set(ScalarColumn<bool>& column) const { column.setValue(flag()); }
    void set(ScalarColumn<int>& column) const { column.setValue(n); }
    void set(ScalarColumn<long long>& column) const { column.setValue(rowID()); }
    void set(ScalarColumn<double>& column) const { column.setValue(date()); }
    void set(ScalarColumn<String>& column) const {
        const Ref<String> value = String::string(text());
        column.setValue(value.get());
    }
    void set(ScalarColumn<URL>& column) const {
        const Ref<String> string = String::string(url());
        const Ref<URL> value = URL::url(string.get());
        column.setValue(value.get());
    }
    void set(ScalarColumn<Date>& column) const {
        const Ref<Date> value = Date::date(date());
        column.setValue(value.get());
    }
    void set(ScalarColumn<TimeZone>& column) const {
        const Ref<TimeZone> value = TimeZone::fixedZone(n * 60);
        column.setValue(value.get());
    }
    void set(ScalarColumn<Data>& column) const {
        const Ref<Data> value = Data::adopt(text());
        column.setValue(value.get());
    }
    template <class T, bool WEAK>
    void set(ToOneColumn<T, WEAK>& column) const {
        const Ref<T> target = TableOf<T>::instance()->rowWithID(rowID());
        column.setValue(target.get());
    }

    bool has(ScalarColumn<bool>& column) const { return column.getValue() == flag(); }
    bool has(ScalarColumn<int>& column) const { return column.getValue() == n; }
    bool has(ScalarColumn<long long>& column) const { return column.getValue() == rowID(); }
    bool has(ScalarColumn<double>& column) const { return column.getValue() == date(); }
    bool has(ScalarColumn<String>& column) const {
        return column.getValue() && column.getValue()->utf8() == text();
    }
    bool has(ScalarColumn<URL>& column) const {
        return column.getValue() && column.getValue()->getString()->utf8() == url();
    }
    bool has(ScalarColumn<Date>& column) const {
        return column.getValue() && column.getValue()->getAbsoluteTime() == date();
    }
    bool has(ScalarColumn<TimeZone>& column) const {
        const Ref<TimeZone> value = TimeZone::fixedZone(n * 60);
        return IsEqual(column.getValue(), value.get());
    }
    bool has(ScalarColumn<Data>& column) const {
        const Ref<Data> value = Data::adopt(text());
        return IsEqual(column.getValue(), value.get());
    }
    template <class T, bool WEAK>
    bool has(ToOneColumn<T, WEAK>& column) const {
        const T* target = column.getValue();
        return target && target->getRowID() == rowID();
    }

    bool hasRaw(const ScalarColumn<bool>&, const Cursor& c) const {
        return c.intColumn(n) == (flag() ? 1 : 0);
    }
    bool hasRaw(const ScalarColumn<int>&, const Cursor& c) const { return c.intColumn(n) == n; }
    bool hasRaw(const ScalarColumn<long long>&, const Cursor& c) const {
        return c.int64Column(n) == rowID();
    }
    bool hasRaw(const ScalarColumn<double>&, const Cursor& c) const {
        return c.doubleColumn(n) == date();
    }
    bool hasRaw(const ScalarColumn<String>&, const Cursor& c) const {
        return c.cStringColumn(n) == text();
    }
    bool hasRaw(const ScalarColumn<URL>&, const Cursor& c) const {
        return c.cStringColumn(n) == url();
    }
    bool hasRaw(const ScalarColumn<Date>&, const Cursor& c) const {
        return c.doubleColumn(n) == date();
    }
    bool hasRaw(const ScalarColumn<TimeZone>&, const Cursor& c) const {
        const Ref<TimeZone> stored = c.timeZoneColumn(n);
        const Ref<TimeZone> value = TimeZone::fixedZone(n * 60);
        return IsEqual(stored.get(), value.get());
    }
    bool hasRaw(const ScalarColumn<Data>&, const Cursor& c) const {
        return c.cStringColumn(n) == text();
    }

    int n;  ///< also the column's place in a row with its ID
};

template <class T>
class RowClassTest : public ModelTest {
 protected:
    /// Saves a row with a sample in each column, and lets go of it.
    static RowID saveSamples() {
        const AutoreleasePool inner;
        const Ref<T> row = Returner<T>::adopted(new T);
        Declared<T>::visit(*row, [](int id, auto& column) { Sample(id).set(column); });
        row->saveChanges();
        return row->getRowID();
    }
    /// As the file has it.
    static Ref<T> fault(RowID rowID) {
        TableOf<T>::instance()->uncacheRows();
        return TableOf<T>::instance()->rowWithID(rowID);
    }
};

using RowClasses = testing::Types<ClientCore, SubscriptionCore, FeedCore, EntryCore, EnclosureCore,
                                  AuthorCore, ContentCore>;
TYPED_TEST_SUITE(RowClassTest, RowClasses);

}  // namespace

TYPED_TEST(RowClassTest, NumbersItsColumnsByTheirPlaceInTheTable) {
    const auto declared = Declared<TypeParam>::columns();
    const Ref<TypeParam> row = Returner<TypeParam>::adopted(new TypeParam);
    ASSERT_EQ(TypeParam::columnList().count(), declared.size());
    std::size_t position = 0;
    Declared<TypeParam>::visit(*row, [&](std::size_t id, Column& column) {
        SCOPED_TRACE(declared[position].name);
        EXPECT_EQ(id, position);
        EXPECT_STREQ(TypeParam::columnList().at(id).name, declared[position].name);
        EXPECT_EQ(&TypeParam::columnList().at(id).in(*row), &column);
        ++position;
    });
    EXPECT_EQ(position, declared.size());
}

TYPED_TEST(RowClassTest, KeepsEachColumnInTheFile) {
    const RowID rowID = this->saveSamples();
    const Ref<TypeParam> row = this->fault(rowID);
    EXPECT_FALSE(row->isLoaded());
    Declared<TypeParam>::visit(*row, [](int id, auto& column) {
        EXPECT_TRUE(Sample(id).has(column)) << "column " << id;
        EXPECT_FALSE(column.isChanged());
    });
    EXPECT_TRUE(row->isLoaded());
}

TYPED_TEST(RowClassTest, WritesEachColumnWhereItBelongs) {
    const RowID rowID = this->saveSamples();
    const Ref<TypeParam> row = this->fault(rowID);
    const Cursor cursor(gDatabase, "select * from %s", TypeParam::kTableName);
    ASSERT_TRUE(cursor.hasRow());
    EXPECT_EQ(cursor.int64Column(0), rowID);
    Declared<TypeParam>::visit(*row, [&](int id, auto& column) {
        EXPECT_TRUE(Sample(id).hasRaw(column, cursor)) << "column " << id;
    });
}

TYPED_TEST(RowClassTest, UpdatesEachColumn) {
    const RowID rowID = this->saveSamples();
    {
        const AutoreleasePool inner;
        const Ref<TypeParam> row = this->fault(rowID);
        // An odd distance, as an even one would leave the booleans.
        Declared<TypeParam>::visit(*row,
                                   [](int id, auto& column) { Sample(id + 101).set(column); });
        row->saveChanges();
        EXPECT_FALSE(row->isChanged());
    }
    const Ref<TypeParam> row = this->fault(rowID);
    Declared<TypeParam>::visit(*row, [](int id, auto& column) {
        EXPECT_TRUE(Sample(id + 101).has(column)) << "column " << id;
    });
}

TYPED_TEST(RowClassTest, UnloadsEveryColumnAndGivesItsChangesUp) {
    const RowID rowID = this->saveSamples();
    const Ref<TypeParam> row = this->fault(rowID);
    Declared<TypeParam>::visit(*row, [](int id, auto& column) { Sample(id + 101).set(column); });
    row->unload();
    EXPECT_FALSE(row->isLoaded());
    Declared<TypeParam>::visit(*row, [](int id, auto& column) {
        EXPECT_FALSE(column.isLoaded() || column.isChanged()) << "column " << id;
    });
    Declared<TypeParam>::visit(
        *row, [](int id, auto& column) { EXPECT_TRUE(Sample(id).has(column)) << "column " << id; });
    // Finds nothing to write, and the row is in order again.
    row->saveChanges();
    EXPECT_FALSE(row->isChanged());
}

TYPED_TEST(RowClassTest, TakesFromAQueryOnlyWhatItHas) {
    this->saveSamples();
    TableOf<TypeParam>* table = TableOf<TypeParam>::instance();
    table->uncacheRows();
    const auto declared = Declared<TypeParam>::columns();
    Cursor cursor(gDatabase, "select rowID, %s from %s", declared.back().name,
                  TypeParam::kTableName);
    const Ref<Row> found = table->_rowForCursor(cursor);
    auto& row = static_cast<TypeParam&>(*found);
    const int last = static_cast<int>(declared.size()) - 1;
    Declared<TypeParam>::visit(row, [&](int id, auto& column) {
        EXPECT_EQ(column.isLoaded(), id == last) << "column " << id;
    });
    Declared<TypeParam>::visit(
        row, [](int id, auto& column) { EXPECT_TRUE(Sample(id).has(column)) << "column " << id; });
}

TYPED_TEST(RowClassTest, IsOneObjectPerRow) {
    const RowID rowID = this->saveSamples();
    const Ref<TypeParam> row = this->fault(rowID);
    EXPECT_EQ(TypeParam::getRow(rowID), row.get());
}

TEST(ColumnIDTest, HasTheNumbersThatClientsSend) {
    EXPECT_EQ(EntryCore::ColumnID::Read, 22);
    EXPECT_EQ(EntryCore::ColumnID::Flagged, 23);
    EXPECT_EQ(EntryCore::ColumnID::LocalDateFlagsUpdated, 27);
    EXPECT_EQ(FeedCore::ColumnID::LocalDateCreatedOfNewestEntry, 27);
    EXPECT_EQ(FeedCore::ColumnID::URL, 8);
    EXPECT_EQ(SubscriptionCore::ColumnID::UnreadCount, 9);
    EXPECT_EQ(ClientCore::ColumnID::Private, 1);
    EXPECT_EQ(EnclosureCore::ColumnID::DownloadErrorCode, 9);
    EXPECT_EQ(AuthorCore::ColumnID::ContactBookUID, 3);
    EXPECT_EQ(ContentCore::ColumnID::MIMEType, 1);
}

namespace {

class RowRelationsTest : public ModelTest {
 protected:
    template <class T>
    static Ref<T> make() {
        return Returner<T>::adopted(new T);
    }
    static Ref<FeedCore> makeFeed() {
        Ref<FeedCore> feed = make<FeedCore>();
        Sample(FeedCore::ColumnID::URL).set(feed->mURL);
        return feed;
    }
};

}  // namespace

TEST_F(RowRelationsTest, OnlyRowsOfClientsSubscriptionsAndFeedsStayInMemory) {
    EXPECT_TRUE(ClientCore::kRetainRows && SubscriptionCore::kRetainRows && FeedCore::kRetainRows);
    EXPECT_FALSE(EntryCore::kRetainRows || EnclosureCore::kRetainRows || AuthorCore::kRetainRows ||
                 ContentCore::kRetainRows);
}

TEST_F(RowRelationsTest, AnEntryIsSavedWithItsChildren) {
    const Ref<EntryCore> entry = make<EntryCore>();
    const Ref<ContentCore> content = make<ContentCore>();
    const Ref<AuthorCore> author = make<AuthorCore>();
    const Ref<EnclosureCore> enclosure = make<EnclosureCore>();
    Sample(1).set(enclosure->mURL);
    entry->mContent.setValue(content.get());
    entry->mAuthor.setValue(author.get());
    enclosure->mEntry.setValue(entry.get());
    entry->mEnclosures.add(enclosure.get());
    entry->saveChanges();
    EXPECT_GT(entry->getRowID(), 0);
    EXPECT_EQ(count("Entries, Contents, Authors, Enclosures where Entries.content=Contents.rowID "
                    "and Entries.author=Authors.rowID and Enclosures.entry=Entries.rowID"),
              1);
}

TEST_F(RowRelationsTest, AFeedIsSavedWithItsEntriesAndSubscriptions) {
    const Ref<FeedCore> feed = makeFeed();
    const Ref<EntryCore> entry = make<EntryCore>();
    entry->mFeed.setValue(feed.get());
    feed->mEntries.add(entry.get());
    const Ref<SubscriptionCore> subscription = make<SubscriptionCore>();
    subscription->mFeed.setValue(feed.get());
    feed->mSubscriptions.add(subscription.get());
    feed->saveChanges();
    EXPECT_EQ(count("Feeds, Entries, Subscriptions where Entries.feed=Feeds.rowID "
                    "and Subscriptions.feed=Feeds.rowID"),
              1);
}

TEST_F(RowRelationsTest, AClientIsSavedWithItsSubscriptions) {
    const Ref<ClientCore> client = make<ClientCore>();
    Sample(0).set(client->mSignature);
    const Ref<SubscriptionCore> subscription = make<SubscriptionCore>();
    subscription->mClient.setValue(client.get());
    client->mSubscriptions.add(subscription.get());
    client->saveChanges();
    EXPECT_EQ(count("Clients, Subscriptions where Subscriptions.client=Clients.rowID"), 1);
    EXPECT_EQ(subscription->mFeed.getValue(), nullptr);
}

TEST_F(RowRelationsTest, AnEntryLeavesAFeedThatIsNotSavedToOthers) {
    const Ref<EntryCore> entry = make<EntryCore>();
    const Ref<FeedCore> feed = makeFeed();
    entry->mFeed.setValue(feed.get());
    EXPECT_EQ(feed->getRefCount(), 1u);
    const Ref<ContentCore> content = make<ContentCore>();
    entry->mContent.setValue(content.get());
    EXPECT_EQ(content->getRefCount(), 2u);
    entry->mFeed.setValue(nullptr);
}
