#include "Model/AuthorCore.h"

#include "Foundation/Logger.h"
#include "Foundation/URL.h"
#include "Model/AgentLink.h"
#include "Model/AuthorIndex.h"
#include "Model/PublicObjects.h"
#include "SQLite/Database.h"
#include "SQLite/QueryOf.h"

namespace Orvane {

using Foundation::IsEqual;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using SQLite::column;

const char AuthorCore::kSchema[] =
    "rowID integer not null unique primary key, name text, email text, url text, "
    "contactBookUid text";

namespace {

/// For a comparison in which null and empty are the same.
void bindText(SQLite::Query& query, int index, const String* text) {
    if (text) {
        query.bind(index, text);
    } else {
        query.bind(index, "", false);
    }
}

}  // namespace

const SQLite::ColumnList& AuthorCore::columnList() {
    static const SQLite::ColumnList sColumns = {
        column<&AuthorCore::mName>("name"),
        column<&AuthorCore::mEmail>("email"),
        column<&AuthorCore::mURL>("url"),
        column<&AuthorCore::mContactBookUID>("contactBookUid"),
    };
    return sColumns;
}

OVObject* AuthorCore::createOVObject() {
    return PublicObjects::makeFor(this);
}

bool AuthorCore::isEmpty() const {
    return String::isEmpty(mName) && String::isEmpty(mEmail) && mURL.getValue() == nullptr;
}

Returner<AuthorCore> AuthorCore::findInDatabase() {
    if (getTable()) return Returner<AuthorCore>::retained(this);
    if (!SQLite::gDatabase || !SQLite::gDatabase->isOpen()) return nullptr;
    SQLite::TableOf<AuthorCore>* table = SQLite::TableOf<AuthorCore>::instance();
    if (SQLite::gDatabase->isWriteable()) {
        static auto* const sIndex = new AuthorIndex(SQLite::gDatabase);
        const SQLite::RowID rowID = sIndex->find({mName, mEmail, mURL});
        return rowID != 0 ? table->rowWithID(rowID) : nullptr;
    }
    static auto* const sQuery = new SQLite::QueryOf<AuthorCore>(
        table,
        "select rowID from Authors  where ifnull(name,'')=? and ifnull(email,'')=?"
        "        and ifnull(URL,'')=?  limit 1");
    bindText(*sQuery, 1, mName);
    bindText(*sQuery, 2, mEmail);
    if (const Foundation::URL* url = mURL) {
        sQuery->bind(3, url);
    } else {
        sQuery->bind(3, "", false);
    }
    return sQuery->firstRow();
}

Returner<AuthorCore> AuthorCore::addToDatabase() {
    Ref<AuthorCore> known = findInDatabase();
    if (known.get()) return known;
    if (SQLite::gDatabase->isWriteable()) {
        saveChanges();
        return Returner<AuthorCore>::retained(this);
    }
    gLogAPI.log("Asking agent to add %@ to db ...", this);
    known = AgentLink::current().createAuthor(mName, mEmail, mURL, mContactBookUID);
    gLogAPI.log("AuthorCore: ...created %@", known);
    return known;
}

bool AuthorCore::public_setContactBookUID(String* uid) {
    if (isChangeable()) {
        mContactBookUID.setValue(uid);
    } else {
        AgentLink::current().setContactBookUID(this, uid);
        mContactBookUID.unload();
    }
    return true;
}

bool IsContentEqual(const AuthorCore* a, const AuthorCore* b) {
    if (a == b) return true;
    if (!a || !b) return false;
    return a->isEqual(b) || (IsEqual(a->mName, b->mName) && IsEqual(a->mEmail, b->mEmail) &&
                             IsEqual(a->mURL, b->mURL));
}

}  // namespace Orvane
