#pragma once

#include "Model/ClientCore.h"
#include "SQLite/QueryOf.h"

#include <Orvane/OVEntryQuery.h>

#include <cstddef>
#include <functional>
#include <string>
#include <vector>

namespace Orvane {

/// The one statement that answers an entry query. Throws `SQLite::Exception`.
class EntryQueryStatement {
 public:
    /// Both must outlive it.
    EntryQueryStatement(const ClientCore& client, const OVEntryQuery& query);

    /// Calls `take` with each entry that is found, in the query's order, each in a pool of its own.
    void walk(const std::function<void(EntryCore*)>& take) const;
    /// How many there are, whatever the limit.
    std::size_t count() const;

    // What is asked of the database.

    std::string entriesSQL() const;
    std::string countSQL() const;

 private:
    using Binding = std::function<void(SQLite::Query&, int)>;

    void chooseFeeds();
    void chooseNames();
    void chooseStates();
    void chooseDates();
    void chooseTexts();
    void add(const std::string& condition, std::vector<Binding> bindings = {});
    std::string dateColumn() const;
    std::string order() const;
    void bind(SQLite::Query& query) const;

    const ClientCore& mClient;
    const OVEntryQuery& mQuery;
    std::string mConditions;
    std::vector<Binding> mBindings;
};

}  // namespace Orvane
