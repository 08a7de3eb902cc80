#pragma once

#include "Foundation/UniqueFD.h"

#include <string>

namespace Support {

/// A network of the test's own while it lives: the process is in a new network namespace, in
/// which there is nothing but a loopback that is down. Main thread.
///
/// A user who may not make one gets it inside a new user namespace, if the system allows that.
/// There is no way back from there: the process stays in it. REQUIRES then: a single thread.
class NetworkNamespace {
 public:
    NetworkNamespace();
    ~NetworkNamespace();
    NetworkNamespace(const NetworkNamespace&) = delete;
    NetworkNamespace& operator=(const NetworkNamespace&) = delete;

    /// Why there is none, empty if there is one: skip the test then, with this as the reason.
    const std::string& problem() const { return mProblem; }
    /// Runs "ip" with the arguments; throws if it fails.
    void ip(const std::string& arguments) const;

 private:
    Foundation::UniqueFD mOutside;  ///< where to go back to
    std::string mProblem;
};

}  // namespace Support
