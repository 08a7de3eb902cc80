#pragma once

#include "Model/CoreOf.h"
#include "SQLite/ScalarColumn.h"

namespace Orvane {

/// A person, whom entries share: a row of "Authors".
class AuthorCore : public CoreOf<AuthorCore> {
 public:
    static constexpr const char* kTableName = "Authors";
    static const char kSchema[];

    /// The positions of the columns, behind "rowID".
    enum ColumnID : int {
        Name = 0,
        Email,
        URL,
        ContactBookUID,
    };

    using CoreOf::CoreOf;

    /// The columns in the order of the table.
    static const SQLite::ColumnList& columnList();

    OVObject* createOVObject() override;

    /// Whether it says nothing of anybody: no name, no email and no URL.
    bool isEmpty() const;
    /// This row if it is in a table; else the row of the file that has the same name, email and
    /// URL, where null and empty are the same. Null if there is none, and if the database is
    /// closed.
    Foundation::Returner<AuthorCore> findInDatabase();

    /// The same, but where there is none this author becomes it or, in a process that only reads,
    /// the agent makes it. Null if the agent could not.
    Foundation::Returner<AuthorCore> addToDatabase();
    /// Sets the contact, by way of the agent where the row may not be changed here. True but for a
    /// failed call, which throws.
    bool public_setContactBookUID(Foundation::String* uid);

    SQLite::ScalarColumn<Foundation::String> mName{this};
    SQLite::ScalarColumn<Foundation::String> mEmail{this};
    SQLite::ScalarColumn<Foundation::URL> mURL{this};
    /// A contact of the contacts service.
    SQLite::ScalarColumn<Foundation::String> mContactBookUID{this};
};

/// Whether the two are one row, or agree in name, email and URL. False if one alone is null.
bool IsContentEqual(const AuthorCore* a, const AuthorCore* b);

}  // namespace Orvane
