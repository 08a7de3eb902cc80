#pragma once

#include "Foundation/MessagePort.h"
#include "Foundation/Notification.h"
#include "Foundation/Ref.h"
#include "Foundation/RunLoopTimer.h"

#include <deque>

namespace Foundation {

/// Relays distributed notifications from whatever thread they arrive on into the run loop of the
/// thread that made this, in their order.
///
/// What the port cannot take yet waits in a queue. The queue has no lock: the platform calls back
/// from one thread, and the timer that tries again is on that thread's loop. If that loop does not
/// turn, what is queued waits.
class NotificationMessagePort : public MessagePort {
 public:
    static constexpr const char* kName = "com.tarnwick.orvane.notification";
    static constexpr double kRetrySeconds = 0.5;

    NotificationMessagePort();
    /// One of another name and capacity.
    NotificationMessagePort(String* name, std::size_t capacity);
    /// Drops what has not been relayed.
    ~NotificationMessagePort() override;

    /// Hands a notification, whose object is a `String`, to the distributed centre's `deliver`: at
    /// once on the port's loop, in a turn of that loop from any other thread.
    void sendNotification(const Notification* notification);

 protected:
    Returner<Data> receive(MessageID id, Data* data) override;

 private:
    static void retrySend(RunLoopTimer* timer, void* info);

    void sendQueuedMessages();
    void startRetryTimer();
    void stopRetryTimer();

    /// Each the bytes of a `Notification` that owns a reference to each of its values.
    std::deque<Ref<Data>> mQueue;
    Ref<RunLoopTimer> mRetryTimer;
};

}  // namespace Foundation
