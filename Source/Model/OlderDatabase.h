#pragma once

namespace Orvane {

/// Who takes over, once per user, what is in the database of the system that this one replaced. Set
/// once per process; null until then, and nothing is taken over.
class OlderDatabase {
 public:
    virtual ~OlderDatabase() = default;

    /// The database of the process is open. Only one that was `createdNew` gets anything.
    virtual void checkIn(bool createdNew) = 0;

    static OlderDatabase* current();
    /// The port must outlive its use.
    static void setCurrent(OlderDatabase* port);
};

}  // namespace Orvane
