#pragma once

namespace Orvane {

/// What carries read and flagged states to the user's other machines, as far as the agent's life
/// depends on it. Set once per process; null until then, and there is no sync.
class AutoSync {
 public:
    virtual ~AutoSync() = default;

    /// Whether the user wants it to happen by itself.
    virtual bool isEnabled() const = 0;
    /// Whether one is under way.
    virtual bool isSyncing() const = 0;
    /// Plans the next one.
    virtual void schedule() = 0;
    /// Seconds until the next one; infinity if none is planned.
    virtual double getTimeRemaining() const = 0;

    static AutoSync* current();
    /// The object must outlive its use.
    static void setCurrent(AutoSync* sync);
};

}  // namespace Orvane
