#pragma once

#include "SQLite/ListedRow.h"
#include "SQLite/ToManyColumn.h"
#include "SQLite/ToOneColumn.h"

/// Row classes of the tests' own, with a column of each kind.

class Group;
class Item;

/// An item's child.
class Note : public SQLite::ListedRow {
 public:
    static constexpr const char* kTableName = "Notes";
    static constexpr bool kCacheAllRows = true;
    static constexpr bool kRetainRows = false;
    static constexpr const char* kSchema =
        "rowID integer not null unique primary key, body text unique";

    explicit Note(SQLite::Table* table = nullptr) : ListedRow(table) {}
    Note(SQLite::Table* table, SQLite::RowID rowID) : ListedRow(table, rowID) {}
    static Foundation::Ref<Note> make(const char* body);

    SQLite::ScalarColumn<Foundation::String> mBody{this};

 protected:
    const SQLite::ColumnList& columns() const override;
    SQLite::Table* ownTable() const override { return SQLite::TableOf<Note>::instance(); }
};

class Item : public SQLite::ListedRow {
 public:
    static constexpr const char* kTableName = "Items";
    static constexpr bool kCacheAllRows = true;
    static constexpr bool kRetainRows = false;
    static constexpr const char* kSchema =
        "rowID integer not null unique primary key, flag integer, number integer, big integer, "
        "real real, title text unique, url text, date real, bytes blob, zone blob, note integer, "
        "owner integer";

    explicit Item(SQLite::Table* table = nullptr) : ListedRow(table) {}
    Item(SQLite::Table* table, SQLite::RowID rowID) : ListedRow(table, rowID) {}
    static Foundation::Ref<Item> make(const char* title);

    SQLite::ScalarColumn<bool> mFlag{this};
    SQLite::ScalarColumn<int> mNumber{this};
    SQLite::ScalarColumn<long long> mBig{this};
    SQLite::ScalarColumn<double> mReal{this};
    SQLite::ScalarColumn<Foundation::String> mTitle{this};
    SQLite::ScalarColumn<Foundation::URL> mURL{this};
    SQLite::ScalarColumn<Foundation::Date> mDate{this};
    SQLite::ScalarColumn<Foundation::Data> mBytes{this};
    SQLite::ScalarColumn<Foundation::TimeZone> mZone{this};
    SQLite::ToOneColumn<Note, false> mNote{this};
    SQLite::ToOneColumn<Group, true> mOwner{this};

 protected:
    const SQLite::ColumnList& columns() const override;
    SQLite::Table* ownTable() const override { return SQLite::TableOf<Item>::instance(); }
};

/// An item's parent. Its table retains its rows.
class Group : public SQLite::ListedRow {
 public:
    static constexpr const char* kTableName = "Groups";
    static constexpr bool kCacheAllRows = true;
    static constexpr bool kRetainRows = true;
    static constexpr const char* kSchema =
        "rowID integer not null unique primary key, name text unique";

    explicit Group(SQLite::Table* table = nullptr) : ListedRow(table) {}
    Group(SQLite::Table* table, SQLite::RowID rowID) : ListedRow(table, rowID) {}
    static Foundation::Ref<Group> make(const char* name);

    SQLite::ScalarColumn<Foundation::String> mName{this};
    SQLite::ToManyColumn<Item> mItems{this, "owner"};

 protected:
    const SQLite::ColumnList& columns() const override;
    SQLite::Table* ownTable() const override { return SQLite::TableOf<Group>::instance(); }
};
