#include <Orvane/OVEntry.h>

#include "Bridges/BridgeTest.h"
#include "Support/AssertionOf.h"

using namespace Foundation;
using namespace Orvane;

namespace {

class OVEntryTest : public BridgeTest {
 protected:
    OVEntryTest() { feedID = addFeed(kAddress); }

    std::shared_ptr<OVEntry> entryOf(const char* identifier) {
        return me()->entryWithIdentifier(identifier);
    }
    /// An entry without a title whose content, or `column`, is this text.
    std::shared_ptr<OVEntry> untitled(const std::string& text, const char* type = "text/plain",
                                      const char* column = "content") {
        const std::string identifier = "u" + std::to_string(++mUntitled);
        const long long entry = addEntry(feedID, identifier, -10, "");
        write(OVFormat("insert into Contents (data,mimeType) values (cast('%s' as blob),'%s')",
                       text, type));
        write(OVFormat("update Entries set %s=(select max(rowID) from Contents) where rowID=%lli",
                       column, entry));
        return entryOf(identifier.c_str());
    }

    long long feedID = 0;

 private:
    int mUntitled = 0;
};

}  // namespace

TEST_F(OVEntryTest, GivesItsColumns) {
    const long long id = addEntry(feedID, "e1", -10, "Title");
    write(
        OVFormat("update Entries set rights='R',dateUpdated=1,datePublished=2,dateCreated=3,"
                 "timeZonePublished=cast('GMT+02:00' as blob),baseUrl='http://e.org/',"
                 "alternateUrl='http://e.org/1',localDateCreated=4,localDateUpdated=5 "
                 "where rowID=%lli",
                 id));
    const std::shared_ptr<OVEntry> entry = entryOf("e1");
    EXPECT_TRUE(entry->isPersistent());
    EXPECT_EQ(entry->identifier(), "e1");
    EXPECT_EQ(entry->title(), "Title");
    EXPECT_EQ(entry->rights(), "R");
    EXPECT_EQ(entry->dateUpdated(), OVDate(1));
    EXPECT_EQ(entry->datePublished(), OVDate(2));
    EXPECT_EQ(entry->dateCreated(), OVDate(3));
    EXPECT_FALSE(entry->timeZoneUpdated());
    EXPECT_EQ(entry->timeZonePublished(), "GMT+02:00");
    EXPECT_FALSE(entry->timeZoneCreated());
    EXPECT_EQ(entry->baseURL(), "http://e.org/");
    EXPECT_EQ(entry->alternateURL(), "http://e.org/1");
    EXPECT_EQ(entry->localDateCreated(), OVDate(4));
    EXPECT_EQ(entry->localDateUpdated(), OVDate(5));
    EXPECT_EQ(entry->dateForDisplay(), OVDate(2));
    EXPECT_TRUE(entry->isCurrent());
    EXPECT_TRUE(entry->current());
    EXPECT_FALSE(entry->read());
    EXPECT_FALSE(entry->flagged());
}

TEST_F(OVEntryTest, HasNoPartsThatItHasNot) {
    addEntry(feedID, "e1");
    const std::shared_ptr<OVEntry> entry = entryOf("e1");
    EXPECT_FALSE(entry->content());
    EXPECT_FALSE(entry->summary());
    EXPECT_TRUE(entry->authors().empty());
    EXPECT_TRUE(entry->contributors().empty());
    EXPECT_TRUE(entry->enclosures().empty());
    EXPECT_EQ(entry->authorsForDisplay(), "");
}

TEST_F(OVEntryTest, HasItsTitleForALabel) {
    addEntry(feedID, "e1", -10, "A title");
    EXPECT_EQ(entryOf("e1")->titleForDisplay(), "A title");
}

TEST_F(OVEntryTest, QuotesItsTextWithoutATitle) {
    EXPECT_EQ(untitled("x")->titleForDisplay(), "\"x\"");
    EXPECT_EQ(untitled("<p>a <b>b</b></p>", "text/html")->titleForDisplay(), "\"a b\"");
    EXPECT_EQ(untitled("s", "text/plain", "summary")->titleForDisplay(), "\"s\"");
    EXPECT_EQ(untitled("two\nlines")->titleForDisplay(), "\"two lines\"");
    addEntry(feedID, "none", -10, "");
    EXPECT_EQ(entryOf("none")->titleForDisplay(), "");
}

TEST_F(OVEntryTest, PrefersTheSummaryForALabel) {
    const std::shared_ptr<OVEntry> entry = untitled("content");
    write("insert into Contents (data,mimeType) values (cast('summary' as blob),'text/plain')");
    write("update Entries set summary=(select max(rowID) from Contents) where title=''");
    EXPECT_EQ(entry->titleForDisplay(), "\"summary\"");
}

TEST_F(OVEntryTest, CutsALabelToAHundredAndTwentyCharacters) {
    // With its quotes, a text of 118 has 120 characters, and one of 119 has 121.
    const std::string fits(118, 'x');
    EXPECT_EQ(untitled(fits)->titleForDisplay(), "\"" + fits + "\"");
    const std::string longer(119, 'x');
    EXPECT_EQ(untitled(longer)->titleForDisplay(), "\"" + std::string(116, 'x') + "...");
    std::string umlauts;
    for (int i = 0; i < 119; ++i) {
        umlauts += "ä";
    }
    const std::string label = untitled(umlauts)->titleForDisplay();
    EXPECT_EQ(label.size(), 1u + 2 * 116 + 3);
}

TEST_F(OVEntryTest, MakesItsLabelAnewWhenItsDataChange) {
    const std::shared_ptr<OVEntry> entry = untitled("x");
    EXPECT_EQ(entry->titleForDisplay(), "\"x\"");
    write("update Contents set data=cast('y' as blob)");
    EXPECT_EQ(entry->titleForDisplay(), "\"x\"");
    write("update Entries set localDateUpdated=localDateUpdated+1");
    EXPECT_EQ(entry->titleForDisplay(), "\"y\"");
}

TEST_F(OVEntryTest, NamesItsAuthors) {
    const long long id = addEntry(feedID, "e1");
    write("insert into Authors (name,email) values ('A. Writer','a@e.org')");
    write(OVFormat("update Entries set author=(select max(rowID) from Authors) where rowID=%lli",
                   id));
    const std::shared_ptr<OVEntry> entry = entryOf("e1");
    ASSERT_EQ(entry->authors().size(), 1u);
    EXPECT_EQ(entry->authors()[0]->email(), "a@e.org");
    EXPECT_EQ(entry->authorsForDisplay(), "A. Writer");
}

TEST_F(OVEntryTest, IsReadAndFlaggedByTheAgent) {
    addEntry(feedID, "e1");
    const std::shared_ptr<OVEntry> entry = entryOf("e1");
    entry->setRead(true);
    entry->setFlagged(true);
    EXPECT_EQ(agent->calls, (Strings{"setRead(1)", "setFlagged(1)"}));
    EXPECT_TRUE(entry->isRead());
    EXPECT_TRUE(entry->isFlagged());
    agent->fails = true;
    EXPECT_EQ(exceptionOf([&] { entry->setRead(false); }), "Orvane: -setRead failed");
    EXPECT_EQ(exceptionOf([&] { entry->setFlagged(false); }), "Orvane: -setFlagged failed");
    EXPECT_TRUE(entry->isRead());
}

TEST_F(OVEntryTest, IsReadByOneCallTogetherWithOthers) {
    const long long one = addEntry(feedID, "e1");
    const long long two = addEntry(feedID, "e2");
    const std::shared_ptr<OVFeed> memory = OVFeed::create(
        "<rss version='2.0'><channel><title>T</title><item><title>I</title></item>"
        "</channel></rss>",
        "http://e.org/m");
    OVEntry::List entries = {entryOf("e1"), memory->entries().at(0), entryOf("e2")};
    agent->calls.clear();
    OVEntry::setEntries(entries, true);
    EXPECT_EQ(agent->calls, Strings{OVFormat("setFlags(%lli %lli,1,-1)", one, two)});
    for (const std::shared_ptr<OVEntry>& entry : entries) {
        EXPECT_TRUE(entry->isRead());
    }
}

TEST_F(OVEntryTest, LeavesOutWhatIsNoEntry) {
    const long long one = addEntry(feedID, "e1");
    const OVEntry::List entries = {nullptr, entryOf("e1"), nullptr};
    agent->calls.clear();
    OVEntry::setEntries(entries, true);
    EXPECT_EQ(agent->calls, Strings{OVFormat("setFlags(%lli,1,-1)", one)});
}

TEST_F(OVEntryTest, ReportsThatManyCouldNotBeRead) {
    addEntry(feedID, "e1");
    const OVEntry::List entries = {entryOf("e1")};
    agent->fails = true;
    OVEntry::setEntries(entries, true);
    EXPECT_TRUE(log.contains("+[OVEntry setEntries:read:]"));
    EXPECT_FALSE(entries[0]->isRead());
}

TEST_F(OVEntryTest, SetsBothStatesOfMany) {
    const long long one = addEntry(feedID, "e1");
    const OVEntry::List entries = {entryOf("e1")};
    agent->calls.clear();
    OVEntry::setFlags(entries, std::nullopt, std::nullopt);
    EXPECT_TRUE(agent->calls.empty());
    OVEntry::setFlags(entries, std::nullopt, true);
    OVEntry::setFlags(entries, false, false);
    EXPECT_EQ(agent->calls,
              (Strings{OVFormat("setFlags(%lli,-1,1)", one), OVFormat("setFlags(%lli,0,0)", one)}));
    agent->fails = true;
    EXPECT_EQ(exceptionOf([&] { OVEntry::setFlags(entries, true, {}); }),
              "Orvane: -setFlags failed");
}

TEST_F(OVEntryTest, SendsNoMoreThanAHundredThousandAtOnce) {
    addEntry(feedID, "e1");
    const OVEntry::List entries(100001, entryOf("e1"));
    std::vector<unsigned> counts;
    struct Counting : UnreachableAgent {
        explicit Counting(std::vector<unsigned>& all) : counts(all) { setCurrent(this); }
        void setFlags(const RowID*, unsigned count, int, int) override { counts.push_back(count); }
        std::vector<unsigned>& counts;
    } counting(counts);
    OVEntry::setEntries(entries, true);
    EXPECT_EQ(counts, (std::vector<unsigned>{100000, 1}));
}

TEST_F(OVEntryTest, LooksItsFeedUpByItsClient) {
    addEntry(feedID, "e1");
    const OVEntry::List found = me()->entries({});
    ASSERT_EQ(found.size(), 1u);
    const Support::LoggingOn logging({&gLog, &gLogAPI});
    EXPECT_EQ(found[0]->feed(), feedOf());
    EXPECT_TRUE(log.contains("Have to look up feed of OVEntry['Title' 1]"));
}

TEST_F(OVEntryTest, WarnsIfItKnowsNoFeed) {
    const long long id = addEntry(feedID, "e1");
    const Ref<EntryCore> core = EntryCore::getRow(id);
    const std::shared_ptr<OVEntry> entry = publicObject<OVEntry>(core.get());
    EXPECT_FALSE(entry->feed());
    EXPECT_TRUE(log.contains("Couldn't find OVFeed of OVEntry["));
}

TEST_F(OVEntryTest, StaysWithItsFeed) {
    addEntry(feedID, "e1");
    addFeed("http://e.org/2");
    const std::shared_ptr<OVEntry> entry = entryOf("e1");
    const std::shared_ptr<OVFeed> other = feedOf("http://e.org/2");
    EXPECT_EQ(entry->title(), "Title");
    EXPECT_EQ(Support::assertionOf([&] { entry->_internal()._setFeed(other); }),
              "Trying to _setFeed of OVEntry['Title' 1] to OVFeed[<http://e.org/2> 2/3] when it's "
              "already OVFeed[<http://example.org/feed> 1/2]");
    EXPECT_EQ(Support::assertionOf([&] { entry->_internal()._setFeed(nullptr); }), "newFeed");
    entry->_internal()._setFeed(feedOf());
    EXPECT_EQ(entry->feed(), feedOf());
}

TEST_F(OVEntryTest, IsOfTheFeedsOfTwoClients) {
    addEntry(feedID, "e1");
    const std::shared_ptr<OVClient> other =
        OVClient::clientForBundleIdentifier("org.example.Other");
    agent->addSubscription(other->_internal().core().getRowID(), feedID);
    const std::shared_ptr<OVFeed> theirs = other->feedWithURL(kAddress);
    const std::shared_ptr<OVFeed> mine = feedOf();
    const OVEntry::List entries = mine->entries();
    ASSERT_EQ(entries.size(), 1u);
    EXPECT_EQ(entries[0]->feed(), mine);
    EXPECT_EQ(theirs->entries(), entries);
    EXPECT_EQ(entries[0]->feed(), theirs);
}

TEST_F(OVEntryTest, IsFoundWithItsFeedByItsEnclosures) {
    write(OVFormat("insert into Enclosures (entry,url) values (%lli,'http://e.org/f')",
                   addEntry(feedID, "e1")));
    // By then the entry's first object is gone.
    const std::shared_ptr<OVEnclosure> enclosure = feedOf()->entries().at(0)->enclosures().at(0);
    EXPECT_EQ(enclosure->entry()->feed(), feedOf());
}

TEST_F(OVEntryTest, IsAnElementOfAtom) {
    const long long id = addEntry(feedID, "e1");
    EXPECT_FALSE(entryOf("e1")->XMLRepresentation());
    EXPECT_TRUE(entryOf("e1")->extensionXMLElementsUsingNamespace(std::nullopt).empty());
    write(
        "insert into Contents (data,mimeType) values (cast('<entry "
        "xmlns=\"http://www.w3.org/2005/Atom\" xmlns:x=\"urn:x\"><x:a>1</x:a><y xmlns=\"urn:y\"/>"
        "</entry>' as blob),'application/atom+xml')");
    write(OVFormat("update Entries set xmlRepresentation=1 where rowID=%lli", id));
    const std::shared_ptr<OVEntry> entry = entryOf("e1");
    ASSERT_TRUE(entry->XMLRepresentation());
    EXPECT_EQ(entry->XMLRepresentation()->localName(), "entry");
    EXPECT_EQ(entry->extensionXMLElementsUsingNamespace(std::nullopt).size(), 2u);
    const auto found = entry->extensionXMLElementsUsingNamespace("urn:x");
    ASSERT_EQ(found.size(), 1u);
    EXPECT_EQ(found[0].stringValue(), "1");
    EXPECT_TRUE(entry->extensionXMLElementsUsingNamespace("urn:z").empty());
}

TEST_F(OVEntryTest, GivesWhatItKnowsOnceItIsDeleted) {
    addEntry(feedID, "e1");
    const std::shared_ptr<OVEntry> entry = entryOf("e1");
    EXPECT_EQ(entry->title(), "Title");
    write("delete from Entries where rowID>0");
    announce();
    EXPECT_EQ(entry->title(), "Title");
}
