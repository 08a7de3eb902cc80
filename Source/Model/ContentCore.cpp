#include "Model/ContentCore.h"

#include "Model/PublicObjects.h"

namespace Orvane {

using SQLite::column;

const char ContentCore::kSchema[] =
    "rowID integer not null unique primary key, data blob, mimeType text";

const SQLite::ColumnList& ContentCore::columnList() {
    static const SQLite::ColumnList sColumns = {
        column<&ContentCore::mData>("data"),
        column<&ContentCore::mMIMEType>("mimeType"),
    };
    return sColumns;
}

OVObject* ContentCore::createOVObject() {
    return PublicObjects::makeFor(this);
}

}  // namespace Orvane
