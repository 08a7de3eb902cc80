#include "SQLite/TestRows.h"

using namespace SQLite;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;

namespace {

/// A free row with its text.
template <class T, class Column>
Ref<T> makeRow(Column T::*column, const char* text) {
    Ref<T> row = Returner<T>::adopted(new T);
    const Ref<String> value = String::string(text);
    (row.get()->*column).setValue(value.get());
    return row;
}

}  // namespace

Ref<Note> Note::make(const char* body) {
    return makeRow<Note>(&Note::mBody, body);
}

const ColumnList& Note::columns() const {
    static const ColumnList sColumns = {column<&Note::mBody>("body")};
    return sColumns;
}

Ref<Item> Item::make(const char* title) {
    return makeRow<Item>(&Item::mTitle, title);
}

const ColumnList& Item::columns() const {
    static const ColumnList sColumns = {
        column<&Item::mFlag>("flag"),   column<&Item::mNumber>("number"),
        column<&Item::mBig>("big"),     column<&Item::mReal>("real"),
        column<&Item::mTitle>("title"), column<&Item::mURL>("url"),
        column<&Item::mDate>("date"),   column<&Item::mBytes>("bytes"),
        column<&Item::mZone>("zone"),   column<&Item::mNote>("note"),
        column<&Item::mOwner>("owner"),
    };
    return sColumns;
}

Ref<Group> Group::make(const char* name) {
    return makeRow<Group>(&Group::mName, name);
}

const ColumnList& Group::columns() const {
    static const ColumnList sColumns = {column<&Group::mName>("name"), toMany<&Group::mItems>()};
    return sColumns;
}
