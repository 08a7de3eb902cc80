#include "Model/Core.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "Foundation/NetException.h"
#include "Model/PublicObjects.h"
#include "SQLite/Cursor.h"

namespace Orvane {

using Foundation::gWarn;
using Foundation::NetError;

Core::~Core() {
    gLogAPIVerbose.log("Core: deleted %p", static_cast<const void*>(this));
    if (!mOVObject) return;
    PublicObjects* port = PublicObjects::current();
    gWarn.log("Deleting %@ while its %s %p is still around!", this,
              port ? port->getClassName(mOVObject) : nullptr, static_cast<const void*>(mOVObject));
}

bool Core::_isInFile(SQLite::Table* table, SQLite::RowID rowID) {
    const SQLite::Row* cached = table->_cachedRowWithID(rowID);
    if (cached && cached->isLoaded()) return true;
    SQLite::Query query(
        table, SQLite::SQLText::format("SELECT rowID FROM %s WHERE rowID=?", table->getName()));
    query.bindRowID(1, rowID);
    return SQLite::Cursor(query).hasRow();
}

Core* Core::_getRow(SQLite::Table* table, SQLite::RowID rowID) {
    // Asked for first, or a table that retains its rows would keep the one that is not there.
    if (rowID > 0 && !_isInFile(table, rowID)) {
        gWarn.log("Core::getRow: No such rowID %llu in %s", rowID, table->getName());
        throw Foundation::NetException(NetError::kOrvane, OVInvalidRowIDError);
    }
    SQLite::Row* row = table->_rowWithID(rowID);
    return static_cast<Core*>(row);
}

void Core::giveUpNewRow(Core* row) {
    // Nothing of what deleting a stored row takes along belongs to it yet.
    if (row && row->getTable() && row->getRowID() == 0) row->Row::deleteRow();
}

OVObject* Core::getOVObject(Core* core) {
    if (!core) return nullptr;
    if (!core->mOVObject) {
        OVObject* made = core->createOVObject();
        OV_ASSERT_AS(made != nullptr, "mOVObject");
        core->setOVObject(made);
    }
    return core->mOVObject;
}

void Core::setOVObject(OVObject* object) {
    if (object == mOVObject) return;
    OV_ASSERT_MESSAGE_AS(mOVObject == nullptr, "mOVObject==NULL",
                         "Core::setOVObject: Can't replace %p with %p",
                         static_cast<const void*>(mOVObject), static_cast<const void*>(object));
    mOVObject = object;
}

void Core::clearOVObject(const OVObject* object) {
    OV_ASSERT_AS(object == mOVObject, "ovObject==mOVObject");
    mOVObject = nullptr;
}

}  // namespace Orvane
