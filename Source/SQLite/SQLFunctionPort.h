#pragma once

struct sqlite3;
struct sqlite3_context;
struct sqlite3_value;

namespace SQLite {

/// One call of a function of SQL: its arguments and where its result goes.
class SQLFunctionCall {
 public:
    /// What a function keeps for a constant argument from one row to the next.
    class Kept {
     public:
        virtual ~Kept() = default;
    };

    SQLFunctionCall(sqlite3_context* context, int count, sqlite3_value** values)
        : mContext(context), mCount(count), mValues(values) {}

    int getArgumentCount() const { return mCount; }
    /// As UTF-8, null for null. Valid during the call.
    const char* getText(int argument) const;
    long long getInteger(int argument) const;

    /// What was kept for an argument; null if there is nothing.
    Kept* getKept(int argument) const;
    /// Keeps something for an argument as long as that is the same constant. Takes it over; it
    /// may be destroyed at once, so do not use it behind this call.
    void keep(int argument, Kept* kept);

    void setResult(long long value);
    void setNullResult();

 private:
    sqlite3_context* mContext;
    int mCount;
    sqlite3_value** mValues;
};

/// Where functions of SQL are added to a connection that opens.
class SQLFunctionInstaller {
 public:
    /// What it throws is reported, and the result is null.
    using Function = void (*)(SQLFunctionCall& call);

    explicit SQLFunctionInstaller(sqlite3* connection) : mConnection(connection) {}

    /// Adds a function that statements may call, but not what the file's schema holds. `name` and
    /// `function` must live as long as the process; -1 allows any number of arguments. False, and
    /// a line in the log, if sqlite3 refuses.
    bool add(const char* name, int argumentCount, Function function);

 private:
    sqlite3* mConnection;
};

/// What a higher layer adds to SQL. Set once per process, before a database opens; null until then.
class SQLFunctionPort {
 public:
    virtual ~SQLFunctionPort() = default;
    virtual void installFunctions(SQLFunctionInstaller& installer) = 0;

    static SQLFunctionPort* current();
    /// The port must outlive its use.
    static void setCurrent(SQLFunctionPort* port);
};

}  // namespace SQLite
