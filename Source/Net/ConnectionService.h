#pragma once

#include "Foundation/Uncopyable.h"

#include <memory>

namespace Orvane {

class Transport;

/// What all connections of the process share.
class ConnectionService : Foundation::Uncopyable {
 public:
    /// Over libcurl. Made at the first use and never destroyed.
    static ConnectionService& shared();
    /// Puts another in its place, for tests, and gives the one before; null for the one above. It
    /// must outlive its connections.
    static ConnectionService* setShared(ConnectionService* service);

    explicit ConnectionService(std::unique_ptr<Transport> transport);
    ~ConnectionService();

    Transport& transport() { return *mTransport; }

 private:
    std::unique_ptr<Transport> mTransport;
};

}  // namespace Orvane
