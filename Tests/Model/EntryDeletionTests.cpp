#include "Model/EntryTest.h"
#include "SQLite/Exception.h"

#include <filesystem>

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

class EntryDeletionTest : public EntryTest {
 protected:
    /// Another entry with all that belongs to one, and the tested one.
    EntryDeletionTest() { fill(*storedEntry("other")); }

    void fill(EntryCore& entry) {
        for (const char* name : {"content", "summary", "XMLRepresentation"}) {
            entry.setContentColumn(name, nullptr, bytes(name));
        }
        entry.addToEnclosures(enclosure("http://e.org/a.mp3"));
        entry.saveChanges();
    }
    std::string entryFile(const EntryCore& entry) const {
        return directory /
               ("Orvane/Feeds/" + feedHash + "/" + textOf(entry.getIdentifier()) + ".xml");
    }
    void archive(EntryCore& entry) {
        feed->getURLOfEntryXMLDir(true);
        feed->saveEntryToFile(entry.getIdentifier(), bytes("<entry/>"));
    }
};

}  // namespace

TEST_F(EntryDeletionTest, TakesContentsAndEnclosuresWithIt) {
    const Ref<EntryCore> entry = storedEntry("abc");
    fill(*entry);
    const LogCapture log;
    const LoggingOn on({});
    const std::string name = textOf(entry->toString());
    entry->deleteRow();
    EXPECT_EQ(count("Contents"), 3);
    EXPECT_EQ(count("Enclosures"), 1);
    EXPECT_EQ(count("Entries"), 1);
    EXPECT_EQ(entry->getTable(), nullptr);
    EXPECT_EQ(log.count("Deleting " + name), 1);
}

TEST_F(EntryDeletionTest, DeletesTheFileOfAnArchivedEntry) {
    const Ref<EntryCore> entry = storedEntry("abc");
    entry->mCurrent.setValue(false);
    archive(*entry);
    const std::string file = entryFile(*entry);
    entry->deleteRow();
    EXPECT_FALSE(std::filesystem::exists(file));
}

TEST_F(EntryDeletionTest, LeavesTheFileOfACurrentEntry) {
    const Ref<EntryCore> entry = storedEntry("abc");
    archive(*entry);
    const std::string file = entryFile(*entry);
    entry->deleteRow();
    EXPECT_TRUE(std::filesystem::exists(file));
}

TEST_F(EntryDeletionTest, AnEntryWithoutAFeedGoes) {
    const Ref<EntryCore> ghost = EntryCore::createGhostEntry(str("0123"));
    ghost->mCurrent.setValue(false);
    ghost->saveChanges();
    ghost->deleteRow();
    EXPECT_EQ(count("Entries"), 1);
}

TEST_F(EntryDeletionTest, AFreeEntryIsOnlyFree) {
    const Ref<EntryCore> entry = newEntry("abc");
    entry->setContentColumn("content", nullptr, bytes("1"));
    entry->deleteRow();
    EXPECT_FALSE(entry->isChanged());
    EXPECT_EQ(count("Entries"), 1);
}

TEST_F(EntryDeletionTest, GoesOnWhereItsChildrenCannotBeDeleted) {
    const Ref<EntryCore> entry = storedEntry("abc");
    const LogCapture log;
    db().execute("drop table Enclosures");
    entry->deleteRow();
    EXPECT_EQ(count("Entries"), 1);
    EXPECT_TRUE(log.contains("virtual void Orvane::EntryCore::deleteRow()"));
}

TEST_F(EntryDeletionTest, MayNotBeDeletedWhereItMayOnlyBeRead) {
    const Ref<EntryCore> entry = storedEntry("abc");
    const RowID rowID = entry->getRowID();
    reopen(false);
    const Ref<EntryCore> read = EntryCore::getRow(rowID);
    const LogCapture log;
    EXPECT_THROW(read->deleteRow(), SQLite::Exception);
    EXPECT_EQ(count("Entries"), 2);
    EXPECT_FALSE(log.contains("virtual void Orvane::EntryCore::deleteRow()"));
}
