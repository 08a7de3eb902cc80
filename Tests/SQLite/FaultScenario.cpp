#include "SQLite/FaultScenario.h"

#include "SQLite/Cursor.h"
#include "SQLite/Database.h"
#include "SQLite/Transaction.h"

#include <sqlite3.h>

#include <algorithm>
#include <array>
#include <exception>
#include <filesystem>

using namespace Foundation;
using namespace SQLite;

namespace {

constexpr int kItems = 30;
constexpr int kFirstDeleted = 11;
constexpr int kLastDeleted = 20;
/// So large that a page holds few rows.
constexpr int kBytes = 1500;

Database& db() {
    return *gDatabase;
}
TableOf<Group>* groups() {
    return TableOf<Group>::instance();
}
TableOf<Item>* items() {
    return TableOf<Item>::instance();
}

Ref<Item> makeItem(const std::string& title) {
    Ref<Item> item = Item::make(title.c_str());
    const std::string bytes(kBytes, title[0]);
    const Ref<Data> data = Data::data(bytes.data(), kBytes, true);
    item->mBytes.setValue(data.get());
    return item;
}

/// A connection of its own to the file, behind the store's back.
class Reader {
 public:
    explicit Reader(const std::string& path) { sqlite3_open(path.c_str(), &mDB); }
    ~Reader() { sqlite3_close(mDB); }
    Reader(const Reader&) = delete;
    Reader& operator=(const Reader&) = delete;

    /// The result, with a bar behind each value and an end of line behind each row.
    std::string read(const std::string& sql) {
        std::string text;
        sqlite3_stmt* statement = nullptr;
        int result = sqlite3_prepare_v2(mDB, sql.c_str(), -1, &statement, nullptr);
        if (result == SQLITE_OK) {
            while ((result = sqlite3_step(statement)) == SQLITE_ROW) {
                for (int i = 0; i < sqlite3_column_count(statement); ++i) {
                    const auto* value = sqlite3_column_text(statement, i);
                    text += value ? reinterpret_cast<const char*>(value) : "";
                    text += '|';
                }
                text += '\n';
            }
        }
        if (result != SQLITE_DONE) text += std::string("ERROR ") + sqlite3_errmsg(mDB);
        sqlite3_finalize(statement);
        return text;
    }

 private:
    sqlite3* mDB = nullptr;
};

std::string itemInMemory(const Item& item) {
    const Ref<Data> bytes = item.mBytes.getValue();
    const Group* owner = item.mOwner.getValue();
    return item.mTitle.getValue()->utf8() + "|" + std::to_string(item.mNumber.getValue()) + "|" +
           std::to_string(bytes->getLength()) + "|" +
           std::to_string(owner ? owner->getRowID() : 0) + "|\n";
}

}  // namespace

FaultScenario::FaultScenario(bool usesWriteAheadLog) : mUsesWriteAheadLog(usesWriteAheadLog) {
    Database::initialize();
    makeFile();
    learnStates();
}

FaultScenario::~FaultScenario() noexcept {
    end();
}

void FaultScenario::makeFile() {
    db().open(mPath.c_str(), true);
    db().execute("PRAGMA auto_vacuum = 2");
    if (mUsesWriteAheadLog) db().useWriteAheadLog();
    fillFile();
    db().close(true);
    mFirstFile = mDirectory.readFile("Database.sqlite3");
}

void FaultScenario::fillFile() {
    groups()->create(Group::kSchema, nullptr, nullptr);
    items()->create(Item::kSchema, nullptr, nullptr);
    const Transaction transaction(true);
    for (int i = 1; i <= kItems; ++i) {
        const AutoreleasePool pool;
        makeItem("item " + std::to_string(i))->saveChanges();
    }
}

/// From a run in which nothing fails.
void FaultScenario::learnStates() {
    begin();
    mStates.push_back(fileContent());
    open();
    readRows();
    changeRows();
    mStates.push_back(fileContent());
    vacuum();
    changeAndClose();
    mStates.push_back(fileContent());
    end();
}

void FaultScenario::removeFiles() const {
    for (const char* suffix : {"", "-wal", "-shm", "-journal"}) {
        std::filesystem::remove(mPath + suffix);
    }
}

void FaultScenario::begin() {
    end();
    removeFiles();
    mDirectory.writeFile("Database.sqlite3", mFirstFile);
}

void FaultScenario::end() {
    vfs.clear();
    db().close(false);
    mItems.clear();
    mGroup = nullptr;
    mNextStep = 0;
    mSavedStates = 0;
    mHasChanges = false;
    mLog.clear();
    mCenter.posts.clear();
}

void FaultScenario::reopen() {
    end();
    const auto state = std::find(mStates.begin(), mStates.end(), fileContent());
    mSavedStates = static_cast<int>(state - mStates.begin());
    mHasChanges = mSavedStates > 0;
}

std::string FaultScenario::run(std::size_t steps) {
    using Step = void (FaultScenario::*)();
    constexpr std::array<Step, kSteps> kAll = {&FaultScenario::open, &FaultScenario::readRows,
                                               &FaultScenario::changeRows, &FaultScenario::vacuum,
                                               &FaultScenario::changeAndClose};
    try {
        for (; mNextStep < steps; ++mNextStep) {
            const AutoreleasePool pool;
            const Step step = kAll.at(mNextStep);
            (this->*step)();
        }
    } catch (const std::exception& exception) {
        return exception.what();
    }
    return "";
}

void FaultScenario::open() {
    if (!db().isOpen()) db().open(mPath.c_str(), true);
    if (mUsesWriteAheadLog) db().useWriteAheadLog();
    db().setPostsNotifications(true);
    // Small, so that pages are read again and written before the commit, and checkpoints happen.
    db().execute("PRAGMA cache_size = 6");
    db().execute("PRAGMA wal_autocheckpoint = 8");
}

void FaultScenario::readRows() {
    mItems.clear();
    for (RowID rowID = 1; rowID < kFirstDeleted; ++rowID) {
        mItems.emplace_back(items()->rowWithID(rowID));
        mItems.back()->doLoad();
    }
    if (mSavedStates > 0) mGroup = groups()->rowWithID(1);
}

/// Again, it makes no change in memory a second time: that the rows know theirs is what counts.
void FaultScenario::changeRows() {
    {
        const Transaction transaction(&db(), true);
        deleteRows();
        if (!mHasChanges) noteChanges();
        db().saveRows();
    }
    mSavedStates = std::max(mSavedStates, 1);
}

void FaultScenario::deleteRows() {
    for (RowID rowID = kFirstDeleted; rowID <= kLastDeleted; ++rowID) {
        if (db().execScalar("select count(*) from Items where rowID = %lld", rowID) == 0) continue;
        const Ref<Item> item = items()->rowWithID(rowID);
        item->deleteRow();
    }
}

void FaultScenario::noteChanges() {
    mHasChanges = true;
    mGroup = Group::make("group");
    mGroup->addToTable(groups());
    for (const Ref<Item>& item : mItems) {
        item->mNumber.setValue(7);
        item->mOwner.setValue(mGroup.get());
    }
    for (const char* title : {"new 1", "new 2", "new 3"}) {
        mItems.push_back(makeItem(title));
        mItems.back()->mOwner.setValue(mGroup.get());
        mItems.back()->addToTable(items());
    }
}

void FaultScenario::vacuum() {
    db().execute("PRAGMA incremental_vacuum");
    db().integrityCheck();
}

void FaultScenario::changeAndClose() {
    const Ref<String> title = String::string("again");
    mItems.front()->mTitle.setValue(title.get());
    if (!mGroup->isChanged()) {
        const Ref<String> name = String::string("renamed");
        mGroup->mName.setValue(name.get());
    }
    db().close(true);
    mSavedStates = 2;
}

std::string FaultScenario::fileContent() const {
    Reader reader(mPath);
    const std::string integrity = reader.read("pragma integrity_check");
    if (integrity != "ok|\n") return "BROKEN: " + integrity;
    return reader.read("select rowID, name from Groups order by rowID") +
           reader.read("select rowID, title, number, hex(bytes), owner from Items order by rowID");
}

std::string FaultScenario::staleRows() const {
    std::string stale;
    if (!db().isOpen()) return stale;
    Reader reader(mPath);
    for (const Ref<Item>& item : mItems) {
        if (item->isChanged()) continue;
        const std::string memory = itemInMemory(*item);
        const std::string file = reader.read(
            "select title, coalesce(number, 0), length(bytes), coalesce(owner, 0) from Items "
            "where rowID = " +
            std::to_string(item->getRowID()));
        if (memory != file) stale += "memory: " + memory + "file: " + file;
    }
    if (mGroup && !mGroup->isChanged()) {
        const std::string memory = mGroup->mName.getValue()->utf8() + "|\n";
        const std::string file = reader.read("select name from Groups where rowID = " +
                                             std::to_string(mGroup->getRowID()));
        if (memory != file) stale += "memory: " + memory + "file: " + file;
    }
    return stale;
}
