#pragma once

namespace Orvane {

/// Who takes the connections of a listening socket.
class ServerSocket {
 public:
    virtual ~ServerSocket() = default;

    /// Takes a connection over: the descriptor is the callee's from here on.
    virtual void accept(int connection) = 0;
};

}  // namespace Orvane
