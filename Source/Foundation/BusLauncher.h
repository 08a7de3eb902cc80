#pragma once

#include <string>
#include <vector>

namespace Foundation {

/// Finds the user's message bus, and starts one where there is none: on a server, in a container,
/// in an account without a desktop.
///
/// A bus of our own listens on the socket "bus" in the runtime directory. The file "bus.lock"
/// beside it is locked while a program looks whether somebody answers there and, if not, starts
/// the daemon, so of several programs that start at once one does and the others find it. The
/// daemon is detached: it outlives the program and shares no descriptor with it.
struct BusLauncher {
    /// Where the user's bus may be, best first: the address that the environment gives, and the
    /// socket that the service manager keeps in the runtime directory.
    static std::vector<std::string> getAddresses();
    /// The address of the system's bus.
    static std::string getSystemAddress();
    /// The address of the bus of our own, started if nobody answers there; waits until it listens,
    /// at most `kStartSeconds`. Empty if it cannot be had; `error` then says why.
    static std::string startOwn(std::string& error);

    /// The address of a Unix socket, with the characters escaped that stand for others there
    /// (D-Bus Specification, "Server Addresses").
    static std::string addressOf(const std::string& socketPath);

    static constexpr int kStartSeconds = 10;
};

}  // namespace Foundation
