// Feeds that change at random from document to document, beside what must have become of each of
// their entries.

#include "FeedParser/ReplayTest.h"

#include <algorithm>
#include <map>
#include <random>

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;

namespace {

constexpr int kDocuments = 40;
constexpr double kNearly = 1e-4;

/// What is expected of a stored entry.
struct Expected {
    Item item;  ///< as it was merged last
    bool isGhost = false;
    bool isCurrent = true;
    bool isRead = false;
    bool isFlagged = false;
    double created = 0;
    double updated = 0;
    double sourceChanged = 0;
};

struct Counts {
    int updated = 0, added = 0, archived = 0;

    void add(const Counts& other) {
        updated += other.updated;
        added += other.added;
        archived += other.archived;
    }
    std::string text() const {
        const bool changed = updated + added + archived != 0;
        return OVFormat("%s %d %d %d", changed ? "changed" : "same", updated, added, archived);
    }
};

class GeneratedReplay : public ReplayTest, public testing::WithParamInterface<int> {
 protected:
    GeneratedReplay() { random.seed(static_cast<unsigned>(GetParam())); }

    int below(int end) { return static_cast<int>(random() % static_cast<unsigned>(end)); }
    bool happens(int onceIn) { return below(onceIn) == 0; }
    Item newItem() {
        Item item{"post-" + std::to_string(++mLastNumber)};
        item.title = "Title " + std::to_string(mLastNumber);
        if (happens(3)) item.length = 1 + below(1000);
        return item;
    }

    /// Writes the next document: something comes, goes, returns or changes, or nothing does.
    void changeDocument() {
        if (mDocument.empty() || happens(2)) mDocument.insert(mDocument.begin(), newItem());
        if (mDocument.size() > 6 || happens(5)) leave(below(static_cast<int>(mDocument.size())));
        if (!mGone.empty() && happens(4)) comeBack(below(static_cast<int>(mGone.size())));
        if (!mDocument.empty() && happens(2)) {
            change(mDocument[static_cast<std::size_t>(below(static_cast<int>(mDocument.size())))]);
        }
        if (happens(8)) std::reverse(mDocument.begin(), mDocument.end());
    }
    void leave(int index) {
        mGone.push_back(mDocument[static_cast<std::size_t>(index)]);
        mDocument.erase(mDocument.begin() + index);
    }
    void comeBack(int index) {
        mDocument.push_back(mGone[static_cast<std::size_t>(index)]);
        mGone.erase(mGone.begin() + index);
        if (happens(2)) change(mDocument.back());
    }
    void change(Item& item) {
        const std::string mark = std::to_string(below(1000000));
        switch (below(5)) {
            case 0:
                item.title = "Mended " + mark;
                break;
            case 1:
                item.date = OVFormat("Tue, 06 Jun 2006 10:%02d:%02d GMT", below(60), below(60));
                break;
            case 2:
                item.length = happens(2) ? 0 : below(1000);
                break;
            case 3:
                item.text = "Another text " + mark;
                break;
            default:
                item.more = "<x:more xmlns:x=\"urn:x\">" + mark + "</x:more>";
        }
    }
    /// What the user does meanwhile, and another machine of the user's.
    void setFlags() {
        for (auto& [guid, expected] : mExpected) {
            if (happens(10)) {
                expected.isRead = !expected.isRead;
                entry(guid)->setRead(expected.isRead);
            }
            if (happens(20)) {
                expected.isFlagged = !expected.isFlagged;
                entry(guid)->setFlagged(expected.isFlagged);
            }
        }
        if (happens(6)) makeGhost("post-" + std::to_string(mLastNumber + 1));
    }
    void makeGhost(const std::string& guid) {
        if (mExpected.contains(guid)) return;
        EntryCore* ghost = EntryCore::createGhostEntry(string(identifierOf(guid)));
        ghost->mRead.setValue(true);
        ghost->saveChanges();
        Expected& expected = mExpected[guid];
        expected.isGhost = expected.isRead = true;
        expected.created = clock.now();
    }

    /// Sets what must come of the merge of the document at this moment.
    Counts expect() {
        Counts counts;
        if (mDocument.empty()) return counts;
        for (auto& [guid, expected] : mExpected) {
            if (expected.isGhost || !expected.isCurrent || isInDocument(guid)) continue;
            expected.isCurrent = false;
            ++counts.archived;
        }
        double created = clock.now();
        for (const Item& item : mDocument) {
            created -= 0.01;
            if (!mExpected.contains(item.guid)) {
                mExpected[item.guid].created = created;
                mExpected[item.guid].isGhost = true;
            }
            expectItem(mExpected[item.guid], item, counts);
        }
        return counts;
    }
    bool isInDocument(const std::string& guid) const {
        return std::any_of(mDocument.begin(), mDocument.end(),
                           [&](const Item& item) { return item.guid == guid; });
    }
    void expectItem(Expected& expected, const Item& item, Counts& counts) {
        const bool isNew = expected.isGhost;
        const bool isBack = !expected.isCurrent;
        if (!isNew && !isBack && XMLOf(item) == XMLOf(expected.item)) return;
        Item withOldExtras = item;
        withOldExtras.more = expected.item.more;
        if (isNew || isBack || XMLOf(withOldExtras) != XMLOf(expected.item)) {
            expected.updated = clock.now();
        }
        expected.sourceChanged = clock.now();
        expected.item = item;
        expected.isGhost = false;
        expected.isCurrent = true;
        ++(isNew ? counts.added : counts.updated);
    }

    void checkAll() const {
        int stored = 0, current = 0, unread = 0, enclosures = 0;
        for (const auto& [guid, expected] : mExpected) {
            if (expected.isGhost) continue;
            checkEntry(guid, expected);
            ++stored;
            current += expected.isCurrent ? 1 : 0;
            unread += expected.isRead ? 0 : 1;
            enclosures += expected.item.length != 0 ? 1 : 0;
        }
        EXPECT_EQ(count("Entries where feed=1"), stored);
        EXPECT_EQ(count("Entries where feed=1 and current"), current);
        EXPECT_EQ(count("Entries where feed=1 and read=0"), unread);
        EXPECT_EQ(subscription->mUnreadCount.getValue(), unread);
        EXPECT_EQ(count("Contents"), 2 * stored);
        EXPECT_EQ(count("Enclosures"), enclosures);
    }
    void checkEntry(const std::string& guid, const Expected& expected) const {
        const EntryCore* stored = entry(guid);
        ASSERT_NE(stored, nullptr) << guid;
        EXPECT_EQ(stateOf(guid), std::string(expected.isCurrent ? "current" : "archived") +
                                     (expected.isRead ? " read" : "") +
                                     (expected.isFlagged ? " flagged" : "") +
                                     (expected.isCurrent ? "" : " file"))
            << guid;
        EXPECT_EQ(text(stored->mTitle), expected.item.title);
        EXPECT_NEAR(Date::getAbsoluteTime(stored->mLocalDateCreated), expected.created, kNearly);
        EXPECT_EQ(Date::getAbsoluteTime(stored->mLocalDateUpdated), expected.updated) << guid;
        EXPECT_EQ(Date::getAbsoluteTime(stored->mLocalDateXMLChanged), expected.sourceChanged)
            << guid;
        const std::string xml = XMLOf(expected.item);
        EXPECT_EQ(text(stored->getXMLRepresentation()->mData), xml);
        EXPECT_EQ(expected.isCurrent ? xml : readFileOf(guid), xml);
    }
    /// Nothing that is in memory alone counts.
    static void forgetEntries() {
        db().saveRows();
        TableOf<EntryCore>::instance()->uncacheRows();
        TableOf<EnclosureCore>::instance()->uncacheRows();
        TableOf<ContentCore>::instance()->uncacheRows();
    }

    /// The document, with an item that comes too late now and then.
    std::vector<Item> items() {
        std::vector<Item> all = mDocument;
        if (!all.empty() && happens(6)) {
            all.push_back(all.front());
            all.back().title = "The second of its GUID";
        }
        return all;
    }

 private:
    std::mt19937 random;
    std::map<std::string, Expected> mExpected;  ///< by GUID
    std::vector<Item> mDocument;
    std::vector<Item> mGone;  ///< has been in the document
    int mLastNumber = 0;
};

}  // namespace

TEST_P(GeneratedReplay, EndsWithWhatItsDocumentsSay) {
    Counts total;
    for (int i = 0; i < kDocuments && !HasFailure(); ++i) {
        SCOPED_TRACE("document " + std::to_string(i));
        const AutoreleasePool inner;
        clock.advanceBy(60 + below(60));
        setFlags();
        if (!happens(8)) changeDocument();
        const double before = Date::getAbsoluteTime(feed->mLocalDateUpdated);
        const std::vector<Item> next = items();
        const Counts counts = expect();
        EXPECT_EQ(read(next), counts.text());
        total.add(counts);
        if (!next.empty()) {
            const bool changed = counts.text().starts_with("changed");
            EXPECT_EQ(Date::getAbsoluteTime(feed->mLocalDateUpdated),
                      changed ? clock.now() : before);
        }
        if (happens(2)) forgetEntries();
        checkAll();
    }
    EXPECT_GT(std::min({total.updated, total.added, total.archived}), 4);
}

INSTANTIATE_TEST_SUITE_P(Seeds, GeneratedReplay, testing::Range(1, 9));
