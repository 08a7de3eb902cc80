#pragma once

namespace SQLite {

class Query;

/// A parameter of a query: assigning a value binds it. Assigning a row binds the row's ID.
class Param {
 public:
    Param(Query& query, int index) : mQuery(&query), mIndex(index) {}

    int getIndex() const { return mIndex; }

    /// Defined in `Query.h`. Takes whatever `Query::bind` takes; a C string is copied.
    template <class T>
    const Param& operator=(const T& value) const;

 private:
    Query* mQuery;
    int mIndex;
};

}  // namespace SQLite
