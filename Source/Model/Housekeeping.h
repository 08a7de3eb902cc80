#pragma once

namespace Orvane {

/// Who looks after the whole database, which rows and migrations ask for. Set once per process;
/// null until then.
class Housekeeping {
 public:
    virtual ~Housekeeping() = default;

    /// Counts the unread entries of every subscription anew, in the loop's next turn.
    virtual void updateAllUnreadCountsSoon() = 0;

    static Housekeeping* current();
    /// The port must outlive its use.
    static void setCurrent(Housekeeping* port);
};

}  // namespace Orvane
