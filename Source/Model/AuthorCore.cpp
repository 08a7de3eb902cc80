#include "Model/AuthorCore.h"

#include "Model/PublicObjects.h"

namespace Orvane {

using SQLite::column;

const char AuthorCore::kSchema[] =
    "rowID integer not null unique primary key, name text, email text, url text, "
    "contactBookUid text";

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

}  // namespace Orvane
