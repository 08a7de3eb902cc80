#pragma once

#include "Foundation/Notification.h"
#include "Foundation/Ref.h"
#include "Foundation/ThreadUtil.h"
#include "Foundation/Timer.h"
#include "Foundation/Uncopyable.h"
#include "SQLite/ChangeSet.h"
#include "SQLite/CursorWatch.h"
#include "SQLite/DatabaseNotifications.h"
#include "SQLite/DeletedRows.h"
#include "SQLite/RowJournal.h"
#include "SQLite/SQLText.h"
#include "SQLite/Types.h"

#include <cstdint>
#include <memory>
#include <vector>

struct sqlite3;

namespace Foundation {
class URL;
}

namespace SQLite {

class Exception;
class Query;
class Statement;
class Table;

/// A connection to a file of sqlite3, or to a database in memory. One process writes to a file;
/// the others read it, and are told by the distributed centre what a commit changed.
///
/// It nests transactions, saves changed rows in one batch, keeps the rows in memory in step with
/// the file when a transaction is rolled back, and tries again where that helps. Failures are
/// `Exception`s; using a closed connection is an `AssertionFailure`.
///
/// Used on the thread that opened it, which runs the run loop; debug builds check that.
class Database : public DatabaseNotifications, Foundation::Uncopyable {
 public:
    using TableChangeDict = SQLite::TableChangeDict;
    static constexpr double kSaveDelaySeconds = 5.0;
    static constexpr int kMaxRuns = 3;         ///< of a statement that meets transient errors
    static constexpr int kMaxFreePages = 256;  ///< that are left alone

    /// Makes the database of the process, once, unless `gDatabase` is set already. It is closed at
    /// the process's end.
    static void initialize();

    Database();
    /// Closes, saving changes. A failure is reported.
    virtual ~Database();

    /// Opens a file, or a database in memory for a null path. A writeable one makes the file where
    /// there is none. Throws `Exception`; the database is then closed.
    void open(const char* path, bool writeable);
    void open(const Foundation::URL* location, bool writeable);
    /// Announces the end, lets the tables go, and ends all statements of the connection, whoever
    /// holds them. May be opened again.
    void close(bool saveChanges);

    /// Turns to the write-ahead log, in which readers and the writer do not wait for each other, or
    /// stays with the roll-back journal where the file system cannot have it. Whether it is on.
    /// A commit is on the disk when it returns, in both. REQUIRES: the mode of `auto_vacuum` is
    /// set, which cannot change after.
    bool useWriteAheadLog();
    /// Whether changes are announced. REQUIRES: a file.
    void setPostsNotifications(bool posts);

    /// Throws for a result code other than 0.
    void check(int result);
    /// Runs the formatted text, which may hold several statements. A transient error is tried again
    /// after a sleep. How many rows the last change changed.
    template <class... Args>
    int execute(SQLFormatString<Args...> format, const Args&... arguments) {
        return executeText(SQLText::format(format, arguments...));
    }
    int executeText(const SQLText& text);
    /// Column 0 of the first row of the formatted query. Throws `AssertionFailure` if there is
    /// none.
    template <class... Args>
    int execScalar(SQLFormatString<Args...> format, const Args&... arguments) {
        return execScalarText(SQLText::format(format, arguments...));
    }
    int execScalarText(SQLText text);
    int getUserVersion();
    void setUserVersion(int version);
    void dropIndex(const char* name);

    /// Transactions nest; only the outermost one counts. `immediate` takes the right to write.
    void beginTransaction(bool immediate);
    /// The end of the outermost one commits and announces what changed; while an exception is in
    /// flight it rolls back instead. A commit that fails rolls back and throws. After a roll-back,
    /// rows that were saved are changed again and new ones are new again.
    void endTransaction();
    bool isInTransaction() const { return mTransactionDepth > 0; }

    /// Saves all changed rows of all tables in one transaction. Does nothing if there are none.
    void saveRows();
    /// The same in 5 seconds, or when an earlier request said.
    void saveRowsSoon();

    /// Throws unless the whole file is in order.
    void integrityCheck();
    /// Gives free pages back to the file system if there are many.
    void vacuumIncrementally();
    /// In a process that only reads, outside of all callbacks of the run loop: lets go of what was
    /// read of rows if another process has changed the file since the last call. Who turns the loop
    /// is told of that, but others are not. Throws `Exception`.
    void refreshIfUnturned();
    /// Whether the place of the open file has another file now, as after `kDatabaseReplaced`, of
    /// which who turns no run loop is not told. False while there is none.
    bool isReplaced() const;
    /// Announces a fatal error at once that is to be announced in the loop's next turn.
    void announceFatalError();
    /// Tells the clients that another file has taken this one's place.
    void postReplacedNotification();

    std::unique_ptr<Statement> compile(const char* sql);
    RowID lastInsertedRowID();
    /// Null if there is none of that name.
    Table* getRegisteredTable(const char* name) const;

    bool isOpen() const { return mOpen; }
    bool isWriteable() const { return mWriteable; }
    /// Null in memory.
    Foundation::URL* getLocation() const { return mLocation.get(); }
    std::uint32_t getGeneration() const { return mGeneration; }
    std::int32_t getBusyTimeout() const { return mBusyTimeout; }
    int getTransactionDepth() const { return mTransactionDepth; }

    // For the row store's own classes.

    sqlite3* db() const;
    RowJournal& journal() { return mJournal; }
    DeletedRows& deletedRows() { return mDeletedRows; }
    CursorWatch& cursors() { return mCursors; }
    void _addTable(Table* table);
    void _removeTable(Table* table);
    void _addStatement(Statement* statement);
    void _removeStatement(Statement* statement);
    /// Throws a copy. A fatal error is also announced, once per burst, in the loop's next turn.
    [[noreturn]] void _throwQueryException(const Exception& exception);
    /// Throws if sqlite3 has ended the open transaction by itself: what is written behind that
    /// would be in the file although the transaction is not.
    void _requireTransaction();
    /// Debug builds throw `AssertionFailure` on another thread than the connection's.
    void _checkThread() const;
    void _databaseUpdated(int action, const char* table, RowID rowID);
    void _postChangeNotification();
    void _postFatalErrorNotification();
    void _receiveChangeNotification(Foundation::Notification* notification);

 private:
    using ChangeObserver = Orvane::MethodReceiver<Foundation::Notification, Database>;

    void openConnection(const char* path);
    void configureConnection();
    void observeChanges();
    void stopObserving();
    void closeConnection();
    void stopTimers();

    int runWithRetry(const SQLText& text);
    void commit();
    void rollBack();

    Foundation::Ref<Foundation::String> getPathString() const;
    void _postLocalChangeNotifications(const Foundation::Dictionary* changes);

    sqlite3* mDB = nullptr;
    Foundation::Ref<Foundation::URL> mLocation;
    bool mOpen = false;
    bool mWriteable = false;
    std::uint32_t mGeneration = 1;
    std::int32_t mBusyTimeout = 25000;  ///< milliseconds
    std::int32_t mTransactionDepth = 0;
    double mTransactionStart = 0;
    std::vector<Table*> mTables;
    std::unique_ptr<ChangeSet> mChanges;  ///< null if nothing is pending
    Foundation::Timer<Database> mSaveTimer;
    Foundation::Timer<Database> mPostTimer;
    Foundation::Timer<Database> mFatalTimer;
    Foundation::Ref<Foundation::Dictionary> mFatalError;
    std::unique_ptr<ChangeObserver> mChangeObserver;
    std::unique_ptr<Query> mVersionQuery;
    int mDataVersion = 0;  ///< of the file, when it was last looked at; 0 before

    RowJournal mJournal;
    DeletedRows mDeletedRows;
    Statement* mStatements = nullptr;
    std::uint32_t mCompiled = 0;  ///< statements, while they are logged
    Foundation::ThreadID mThread = 0;
    CursorWatch mCursors;
};

/// The database of the process, or null.
extern Database* gDatabase;

}  // namespace SQLite
