#pragma once

#include "Foundation/RunLoopSource.h"
#include "Foundation/Uncopyable.h"

#include <sys/types.h>

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

namespace Foundation {

class Data;

using MessageID = std::int32_t;

/// What a send gives: 0, or one of these.
enum MessagePortError : int {
    kMessagePortSendWouldWait = -1,  ///< the port has as many messages as it holds
    kMessagePortIsInvalid = -3,      ///< the port has ended
};

/// The messages on their way to a port. Shared by the port and who sends to it; any thread.
class MessagePortBox;

/// The receiving end of a port inside the process, which other threads find by its name. A source
/// of a run loop that hands one message per turn to its callback, also in runs inside the callback.
class LocalMessagePort : public RunLoopSource {
 public:
    /// Called inside a pool. The result, a reply that nobody waits for, comes with a reference.
    using Callback = Data* (*)(LocalMessagePort* port, MessageID id, Data* data, void* info);

    /// A port that holds up to `capacity` messages. Null if the process has one of this name.
    static std::unique_ptr<LocalMessagePort> create(const std::string& name, std::size_t capacity,
                                                    Callback callback, void* info);
    ~LocalMessagePort() override;

    const std::string& getName() const { return mName; }
    /// Takes no more messages, and drops those that are on their way.
    void invalidate();

 private:
    LocalMessagePort(std::string name, std::shared_ptr<MessagePortBox> box, Callback callback,
                     void* info);

    Interest interest() noexcept override;
    void ready(short events) override;
    bool isReentrant() const noexcept override { return true; }

    const std::string mName;
    const std::shared_ptr<MessagePortBox> mBox;
    const Callback mCallback;
    void* const mInfo;
};

/// The sending end. Any thread.
class RemoteMessagePort : Uncopyable {
 public:
    /// The port of this name in the process `pid`; null if there is none. Ports are of one process,
    /// so that of another has none.
    static std::unique_ptr<RemoteMessagePort> create(const std::string& name, pid_t pid);

    /// Sends a copy of the bytes without waiting. 0 or a `MessagePortError`.
    int send(MessageID id, std::string_view bytes);

 private:
    explicit RemoteMessagePort(std::shared_ptr<MessagePortBox> box) : mBox(std::move(box)) {}

    const std::shared_ptr<MessagePortBox> mBox;
};

}  // namespace Foundation
