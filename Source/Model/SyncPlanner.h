#pragma once

namespace Orvane {

/// Who carries what was read and flagged to the user's other machines. Set once per process; null
/// until then, and nothing is carried.
class SyncPlanner {
 public:
    virtual ~SyncPlanner() = default;

    /// Plans a sync for some time from now, or does nothing if one is planned.
    virtual void autoSyncSoon() = 0;

    static SyncPlanner* current();
    /// The port must outlive its use.
    static void setCurrent(SyncPlanner* port);
};

}  // namespace Orvane
