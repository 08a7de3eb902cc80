#pragma once

#include "Foundation/LocalMessagePort.h"
#include "Foundation/Returner.h"
#include "Foundation/Uncopyable.h"

#include <cstddef>
#include <memory>

namespace Foundation {

class RunLoop;

/// A way for other threads to hand messages to a thread's run loop.
class MessagePort : Uncopyable {
 public:
    /// How many messages may be on their way; with more, senders are told to wait. Enough for a
    /// burst that comes while the port's thread is busy, since who has to wait does so for long.
    static constexpr std::size_t kCapacity = 4096;

    /// A port on the current run loop, in the common modes. With a null name it gets one of its
    /// own. Throws `AssertionFailure` if the process has a port of this name.
    explicit MessagePort(String* name, std::size_t capacity = kCapacity);
    /// On the thread of the port's loop.
    virtual ~MessagePort();

    /// Sends a copy of the data, which may be null for none, without waiting. 0 or a
    /// `MessagePortError`. Logs with GLib's logger: ours is for the run-loop thread.
    int sendFromAnyThread(MessageID id, const Data* data);

 protected:
    /// Called with each message, in the order they were sent, on the port's loop. Nobody waits for
    /// the result. What it throws is reported.
    virtual Returner<Data> receive(MessageID id, Data* data) = 0;

    /// Ends the port: it takes no more messages, and drops those that are on their way. On the
    /// thread of the port's loop.
    void invalidate();

    RunLoop* const mRunLoop;

 private:
    static Data* _callback(LocalMessagePort* port, MessageID id, Data* data, void* info);

    std::unique_ptr<LocalMessagePort> mLocalPort;
    std::unique_ptr<RemoteMessagePort> mRemotePort;
};

}  // namespace Foundation
