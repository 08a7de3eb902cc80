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

 private:
    using Receiver = MethodReceiver<Foundation::Notification, ClientSession>;

    ClientSession() = default;

    void openDatabase();
    void observe();
    void databaseBroke(Foundation::Notification* notification);
    void databaseWasReplaced(Foundation::Notification* notification);

    Receiver mBroke{this, &ClientSession::databaseBroke};
    Receiver mReplaced{this, &ClientSession::databaseWasReplaced};
};

}  // namespace Orvane
