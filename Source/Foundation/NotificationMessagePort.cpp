#include "Foundation/NotificationMessagePort.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Clock.h"
#include "Foundation/Data.h"
#include "Foundation/Dictionary.h"
#include "Foundation/DistributedNotificationCenter.h"
#include "Foundation/Logger.h"
#include "Foundation/RunLoop.h"
#include "Foundation/String.h"

#include <cstring>
#include <utility>

namespace Foundation {

namespace {

static_assert(sizeof(Notification) == 3 * sizeof(void*));

String* portName() {
    static String* const sName = String::string(NotificationMessagePort::kName).detach();
    return sName;
}

Notification notificationIn(const Data& data) {
    Notification notification;
    std::memcpy(&notification, data.getBytes(), sizeof notification);
    return notification;
}

void retainValues(const Notification& notification) {
    retain(notification.name);
    retain(notification.getObject<String>());
    retain(notification.info);
}

void releaseValues(const Notification& notification) {
    release(notification.name);
    release(notification.getObject<String>());
    release(notification.info);
}

}  // namespace

NotificationMessagePort::NotificationMessagePort() : MessagePort(portName()) {}

NotificationMessagePort::NotificationMessagePort(String* name, std::size_t capacity)
    : MessagePort(name, capacity) {}

NotificationMessagePort::~NotificationMessagePort() {
    stopRetryTimer();
    for (const Ref<Data>& queued : mQueue) {
        releaseValues(notificationIn(*queued));
    }
}

void NotificationMessagePort::sendNotification(const Notification* notification) {
    if (&RunLoop::current() == mRunLoop) {
        AutoreleasePool pool;
        DistributedNotificationCenter::instance()->deliver(notification);
        return;
    }
    retainValues(*notification);
    mQueue.emplace_back(Data::data(notification, sizeof *notification));
    sendQueuedMessages();
}

void NotificationMessagePort::sendQueuedMessages() {
    while (!mQueue.empty()) {
        const int error = sendFromAnyThread(0, mQueue.front());
        if (error == kMessagePortSendWouldWait) {
            gLogMsg.log("Notification queue is full ... will retry in %g sec", kRetrySeconds);
            startRetryTimer();
            return;
        }
        if (error != 0) {
            gWarn.log("Failed to relay distributed notification: PFMessagePort err %i", error);
            releaseValues(notificationIn(*mQueue.front()));
        }
        mQueue.pop_front();
    }
    stopRetryTimer();
}

void NotificationMessagePort::startRetryTimer() {
    if (mRetryTimer) return;
    mRetryTimer = Returner<RunLoopTimer>::adopted(
        new RunLoopTimer(Clock::current().now() + kRetrySeconds, kRetrySeconds,
                         [this] { retrySend(mRetryTimer.get(), this); }));
    RunLoop::current().addTimer(mRetryTimer.get(), RunLoop::kCommonModes);
}

void NotificationMessagePort::stopRetryTimer() {
    if (!mRetryTimer) return;
    gLogMsg.log("All notifications sent; stopping retry timer");
    // Moved out, since what an assignment replaces would go to a pool, and there may be none.
    const Ref<RunLoopTimer> timer = std::move(mRetryTimer);
    timer->invalidate();
}

void NotificationMessagePort::retrySend(RunLoopTimer*, void* info) {
    try {
        static_cast<NotificationMessagePort*>(info)->sendQueuedMessages();
    } catch (...) {
        warnAboutCurrentException(
            "static void Foundation::NotificationMessagePort::retrySend(RunLoopTimer *, void *)");
    }
}

Returner<Data> NotificationMessagePort::receive(MessageID, Data* data) {
    const bool isWhole = data && data->getLength() == sizeof(Notification);
    const void* const n = isWhole ? data->getBytes() : nullptr;
    OV_ASSERT_AS(n, "n");
    const Notification notification = notificationIn(*data);
    autorelease(notification.name);
    autorelease(notification.getObject<String>());
    autorelease(notification.info);
    DistributedNotificationCenter::instance()->deliver(&notification);
    return nullptr;
}

}  // namespace Foundation
