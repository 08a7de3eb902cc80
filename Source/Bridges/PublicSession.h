#pragma once

namespace Orvane {

/// What a process needs that uses the public interface: what stands behind the ports of the model,
/// and the database open for reading.
class PublicSession {
 public:
    /// Opens the session, unless it is open. Throws what `ClientSession::open` does.
    static void open();
    /// Connects what stands behind the ports, once.
    static void connect();
};

}  // namespace Orvane
