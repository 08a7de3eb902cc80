#include "SQLite/Row.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "Foundation/String.h"
#include "Foundation/TypeName.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"
#include "SQLite/Exception.h"
#include "SQLite/Statement.h"
#include "SQLite/Table.h"

#include <sqlite3.h>

namespace SQLite {

using Foundation::gWarn;
using Foundation::Ref;
using Foundation::RefCounted;
using Foundation::String;

namespace {

int sRowCount = 0;  ///< counts only while it is logged

const char* nameOf(const Table* table) {
    return table ? table->getName() : nullptr;
}

/// Spreads the bits of a value over all of them, as splitmix64 does.
std::uint64_t mix(std::uint64_t value) {
    value = (value ^ (value >> 30)) * 0xBF58476D1CE4E5B9U;
    value = (value ^ (value >> 27)) * 0x94D049BB133111EBU;
    return value ^ (value >> 31);
}

}  // namespace

Row::Row(Table* table)
    : mTable(table),
      mRowID(0),
      mChanged(false),
      mLoaded(true),
      mCached(false),
      mRetained(false),
      mNew(false),
      mProvisional(false) {
    if (gLogPersist.willLog()) {
        gLogPersist.log("Created new Row %p in %s [now %i]", this, nameOf(table), ++sRowCount);
    }
}

Row::Row(Table* table, RowID rowID)
    : mTable(table),
      mRowID(rowID),
      mChanged(false),
      mLoaded(false),
      mCached(false),
      mRetained(false),
      mNew(false),
      mProvisional(false) {
    OV_ASSERT_AS(table != nullptr, "table!=NULL");
    OV_ASSERT_AS(rowID > 0, "rowID>0");
    if (gLogPersist.willLog()) {
        gLogPersist.log("Instantiated row %s[%lli] %p [now %i]", nameOf(table), rowID, this,
                        ++sRowCount);
    }
}

Row::~Row() {
    if (mTable) warnOfDealloc();
    if (!gLogPersist.willLog()) return;
    --sRowCount;
    if (mTable) {
        gLogPersist.log("Dealloced Row %s[%lli] %p [%i left]", nameOf(mTable), mRowID, this,
                        sRowCount);
    } else {
        gLogPersist.log("Dealloced row %p [%i left]", this, sRowCount);
    }
}

void Row::warnOfDealloc() {
    if (mRetained) {
        gWarn.log(
            "Dealloced Row %s[%lli] with its mRetained flag set! Someone else has over-released "
            "it.",
            nameOf(mTable), mRowID);
        mRetained = false;
    }
    if (mCached) {
        gLogPersist.log("Uncaching dealloced Row %s[%lli] %p", nameOf(mTable), mRowID, this);
        try {
            mTable->_uncacheRow(this);
        } catch (...) {
            Foundation::warnAboutCurrentException("virtual SQLite::Row::~Row()");
        }
    }
    if (mChanged) {
        gWarn.log("Dealloced Row %s[%lli] with unsaved changes!", nameOf(mTable), mRowID);
    }
}

std::size_t Row::getPFHashCode() const {
    if (mRowID == 0) return RefCounted::getPFHashCode();
    return mix(static_cast<std::uint64_t>(mRowID) ^ reinterpret_cast<std::uintptr_t>(mTable));
}

bool Row::isEqual(const RefCounted* other) const {
    if (this == other) return true;
    const auto* row = dynamic_cast<const Row*>(other);
    return row && mRowID != 0 && row->mRowID == mRowID && row->mTable == mTable;
}

Foundation::StringReturner Row::toString() const {
    const char* name = Foundation::getTypeName(typeid(*this));
    if (!mTable) return String::stringWithFormat("%s[%p]", name, this);
    return String::stringWithFormat("%s[%s #%lli] %p", name, nameOf(mTable), mRowID, this);
}

void Row::unload() {
    mLoaded = false;
    // What is not in the file has nothing to go back to: it stays to be saved.
    if (!mChanged || mRowID == 0) return;
    mChanged = false;
    mTable->_rowUnchanged(this);
}

void Row::_forgetLoaded() {
    if (!mChanged) unload();
}

void Row::loadColumn(const Column*) const {
    doLoad();
}

bool Row::loadFrom(const Cursor& cursor) {
    OV_ASSERT_MESSAGE_AS(cursor.rowID() == mRowID, "curs.int64Column(\"rowID\")==mRowID",
                         "loadFrom: Cursor has wrong or missing rowID");
    gLogPersist.log("Loaded %i columns of Row %s[%lli]", cursor.columnCount(), nameOf(mTable),
                    mRowID);
    return true;
}

void Row::doLoad() const {
    gLogPersist.log("Faulting in %@", this);
    OV_ASSERT_MESSAGE_AS(mTable != nullptr, "mTable", "Can't load, no table");
    OV_ASSERT_AS(mRowID != 0, "mRowID!=0");
    Query& query = mTable->_rowQuery();
    query.bindRowID(1, mRowID);
    const Cursor cursor(query);
    OV_ASSERT_MESSAGE_AS(cursor.hasRow(), "curs.hasRow()", "Loading nonexistent rowID %llu!",
                         mRowID);
    doLoad(cursor);
}

void Row::doLoad(const Cursor& cursor) const {
    // Reading a row changes what it has in memory, not what it is.
    if (const_cast<Row*>(this)->loadFrom(cursor)) mLoaded = true;
}

void Row::addToTable(Table* table) {
    OV_ASSERT_MESSAGE_AS(table != nullptr, "table", "NULL table");
    if (mTable == table) return;
    OV_ASSERT_MESSAGE_AS(mTable == nullptr, "!mTable", "Can't add Row to a second Table");
    table->requireChangeable();
    gLogPersist.log("Adding Row %p to table %s", this, nameOf(table));
    mTable = table;
    mTable->_rowAdded(this);
    setChanged();
}

void Row::setChanged() {
    if (mChanged) return;
    requireChangeable();
    mChanged = true;
    if (!mTable) return;
    gLogPersist.log("Changed Row %s[%lli]", nameOf(mTable), mRowID);
    mTable->_rowChanged(this);
}

void Row::setCached(bool cached, bool retained) {
    OV_ASSERT_AS(mTable != nullptr, "mTable");
    mCached = cached;
    if (mRetained == retained) return;
    gLogPersist.log("Set retained=%u for %@", retained, this);
    mRetained = retained;
    if (retained) {
        retain();
    } else {
        release();
    }
}

bool Row::isChangeable() const {
    if (!mTable) return true;
    const Database* database = mTable->getDatabase();
    return !database || database->isWriteable();
}

void Row::requireChangeable() const {
    if (!isChangeable()) {
        throw Exception(SQLITE_AUTH, "Cannot change row: database is not writeable");
    }
    if (mTable && mTable->getDatabase()) mTable->getDatabase()->_checkThread();
}

void Row::saveChanges() {
    if (!mChanged) return;
    OV_ASSERT_MESSAGE_AS(mTable != nullptr, "mTable",
                         "Can't saveChanges to row that's not added to a Table");
    Database* database = mTable->getDatabase();
    if (database->isInTransaction()) database->journal().noteSave(*this);
    if (mRowID != 0) {
        gLogPersist.log("Updating Row %s[%lli] %p", nameOf(mTable), mRowID, this);
        doUpdate();
        mChanged = false;
        mTable->_rowSaved(this, false);
    } else {
        gLogPersist.log("Inserting Row into %s", nameOf(mTable));
        mRowID = doInsert();
        gLogPersist.log("Inserted Row -- now %s[%lli] %p", nameOf(mTable), mRowID, this);
        mChanged = false;
        OV_ASSERT_AS(mRowID != 0, "mRowID");
        mTable->_rowSaved(this, true);
    }
}

void Row::deleteRow() {
    requireChangeable();
    // The table may have the last reference. An object that nobody owns yet must not get one.
    const Ref<Row> self = getRefCount() > 0 ? this : nullptr;
    const bool wasChanged = mChanged;
    mChanged = false;
    try {
        if (mTable) mTable->_deleteRow(this);
    } catch (...) {
        // The row is still there, and its changes are still to be saved.
        mChanged = wasChanged;
        throw;
    }
    mRowID = 0;
    mTable = nullptr;
    mLoaded = true;
}

}  // namespace SQLite
