#pragma once

#include "Foundation/Dictionary.h"
#include "Foundation/Ref.h"

#include <cstdint>

namespace Orvane {

/// The user's service manager: starts this process on demand, hands it the sockets that it has
/// listened on, and starts it again after a while. Main thread.
class ServiceManager {
 public:
    /// The answer to a check-in.
    struct Reply {
        enum Type : int { kNone, kDictionary, kError, kOther };

        Type type = kNone;
        Foundation::Ref<Foundation::Dictionary> dictionary = nullptr;  ///< of that type
        int error = 0;                                                 ///< an `errno`, of that type
    };

    // Keys of the dictionary.

    /// From a socket's name to an array of listening descriptors.
    static constexpr const char* kSockets = "Sockets";
    /// From a service's name to a number other than 0, if the process was started for it.
    static constexpr const char* kServices = "MachServices";

    virtual ~ServiceManager() = default;

    /// Whether this process is one of the manager's.
    virtual bool isManaged() = 0;
    /// Asks for what the manager has for the process. REQUIRES: once per process.
    virtual Reply checkIn() = 0;
    /// Has the process started again `seconds` from now, unless it runs then. Replaces what was
    /// asked for before, also by an earlier process. 0, or an `errno`; waits for the answer.
    virtual int setStartInterval(std::int64_t seconds) = 0;

    /// That of the process.
    static ServiceManager& current();
    /// The object must outlive its use; null for the system's own.
    static void setCurrent(ServiceManager* manager);
};

}  // namespace Orvane
