#pragma once

#include "Foundation/Notification.h"
#include "Foundation/Uncopyable.h"

namespace Orvane {

/// How an application's process opens the database for reading, and keeps it open: where the file
/// is missing, old, broken or replaced, it asks the agent to see to it and opens it again.
///
/// One per process, made on first use and never destroyed. Main thread.
class ClientSession : Foundation::Uncopyable {
 public:
    /// Opens the database of the process, unless it is open already. If that cannot be, reports why
    /// and throws a `std::exception` that says nothing more; the database is then closed.
    static void open();
    /// For whoever turns no run loop, outside of all its callbacks, and is not told: sees to it
    /// that what is open is the database that there is now, and what was read of it up to date. A
    /// session that could not go on tries again. Throws as `open` does, and `SQLite::Exception`.
    static void catchUpIfUnturned();

 private:
    using Receiver = MethodReceiver<Foundation::Notification, ClientSession>;

    ClientSession() = default;

    void openDatabase();
    void follow();
    void observe();
    void databaseBroke(Foundation::Notification* notification);
    void databaseWasReplaced(Foundation::Notification* notification);

    Receiver mBroke{this, &ClientSession::databaseBroke};
    Receiver mReplaced{this, &ClientSession::databaseWasReplaced};
};

}  // namespace Orvane
