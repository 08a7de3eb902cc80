#include "Foundation/DistributedNotificationCenter.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/BusCenter.h"
#include "Foundation/Dictionary.h"
#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/NotificationMessagePort.h"
#include "Foundation/String.h"

#include <utility>

namespace Foundation {

namespace {

/// The process's relay, made at the first `addObserver` on the loop of its thread. Never destroyed.
NotificationMessagePort* sNotificationPort = nullptr;

DistributedNotificationCenter* sInstance = nullptr;

void OVNotificationCenterDistributedNotificationCallback(PlatformCenter*, void*, String* name,
                                                         void* object, Dictionary* info) {
    try {
        gLogMsg.log("Received distributed notification '%@' on '%@' [%p], info=%@", name,
                    static_cast<String*>(object), object, info);
        const Notification notification{name, object, info};
        sNotificationPort->sendNotification(&notification);
    } catch (...) {
        warnAboutCurrentException(
            "void Foundation::OVNotificationCenterDistributedNotificationCallback(PlatformCenter "
            "*, void *, String *, void *, Dictionary *)");
    }
}

}  // namespace

DistributedNotificationCenter* DistributedNotificationCenter::instance() {
    static auto* const sOfBus = new DistributedNotificationCenter(new BusCenter);
    return sInstance ? sInstance : sOfBus;
}

DistributedNotificationCenter* DistributedNotificationCenter::setInstance(
    DistributedNotificationCenter* center) {
    return std::exchange(sInstance, center);
}

String* DistributedNotificationCenter::getCanonicalString(String* string) {
    if (!string) return nullptr;
    Sender& sender = mSenders.try_emplace(string->utf8(), Sender{string}).first->second;
    sender.isKept = true;
    return sender.string;
}

void DistributedNotificationCenter::addObserver(NotificationReceiver* receiver, String* name,
                                                void* object) {
    OV_ASSERT_AS(name, "notificationName");
    String* sender = getCanonicalString(static_cast<String*>(object));
    subscribe(name, sender);
    getLocal()->addObserver(receiver, name, sender);
}

void DistributedNotificationCenter::subscribe(String* name, String* sender) {
    std::vector<std::string> registration = {name->utf8()};
    if (sender) registration.push_back(sender->utf8());
    if (mRegistrations.contains(registration)) return;
    if (!sNotificationPort) sNotificationPort = new NotificationMessagePort;
    gLogMsg.log(
        "Installing DistributedNotificationCallback for notification='%@', sender='%@' [%p]", name,
        sender, sender);
    mCenter->addObserver(this, OVNotificationCenterDistributedNotificationCallback, name, sender);
    mRegistrations.insert(std::move(registration));
}

void DistributedNotificationCenter::removeObserver(NotificationReceiver* receiver, String* name,
                                                   void* object) {
    getLocal()->removeObserver(receiver, name, getCanonicalString(static_cast<String*>(object)));
}

void DistributedNotificationCenter::removeObserver(NotificationReceiver* receiver) {
    getLocal()->removeObserver(receiver);
}

void DistributedNotificationCenter::deliver(const Notification* notification) {
    auto* const object = notification->getObject<String>();
    String* sender = nullptr;
    bool isNew = false;
    if (object) {
        const auto [entry, isAdded] = mSenders.try_emplace(object->utf8(), Sender{object});
        sender = entry->second.string;
        isNew = isAdded;
    }
    gLogMsg.log("Delivering dist. notification '%@' on '%@' [%p]", notification->name, sender,
                sender);
    getLocal()->post(notification->name, sender, notification->info);
    // Some objects tell how far a download is: those that nobody asked for would pile up.
    if (isNew && !mSenders[object->utf8()].isKept) mSenders.erase(object->utf8());
}

}  // namespace Foundation
