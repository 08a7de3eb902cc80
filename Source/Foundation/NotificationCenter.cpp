#include "Foundation/NotificationCenter.h"

#include "Foundation/Dictionary.h"
#include "Foundation/DistributedNotificationCenter.h"
#include "Foundation/Guard.h"
#include "Foundation/LocalCenter.h"
#include "Foundation/Logger.h"
#include "Foundation/String.h"

namespace Foundation {

namespace {

void OVNotificationCenterLocalNotificationCallback(PlatformCenter*, void* observer, String* name,
                                                   void* object, Dictionary* info) {
    callGuarded(
        "void Foundation::OVNotificationCenterLocalNotificationCallback(PlatformCenter *, void *, "
        "String *, void *, Dictionary *)",
        [&] {
            gLogMsg.log("Received notification '%@' on %p, info=%@", name, object, info);
            Notification notification{name, object, info};
            (*static_cast<NotificationReceiver*>(observer))(&notification);
        });
}

}  // namespace

NotificationCenter* NotificationCenter::getLocal() {
    struct Local : NotificationCenter {
        Local() : NotificationCenter(new LocalCenter) {}
    };
    // Never destroyed: objects that end with the process still remove themselves.
    static Local* const sLocal = new Local;
    return sLocal;
}

DistributedNotificationCenter* NotificationCenter::getDistributed() {
    return DistributedNotificationCenter::instance();
}

void NotificationCenter::addObserver(NotificationReceiver* receiver, String* name, void* object) {
    gLogMsg.log(
        "Installing LocalNotificationCallback on ctr %p for observer=%p, notification= %@, %p",
        mCenter, receiver, name, object);
    mCenter->addObserver(receiver, OVNotificationCenterLocalNotificationCallback, name, object);
}

void NotificationCenter::removeObserver(NotificationReceiver* receiver, String* name,
                                        void* object) {
    mCenter->removeObserver(receiver, name, object);
    gLogMsg.log("Removed observer %p for %@, obj=%p", receiver, name, object);
}

void NotificationCenter::removeObserver(NotificationReceiver* receiver) {
    mCenter->removeEveryObserver(receiver);
    gLogMsg.log("Removed observer %p", receiver);
}

void NotificationCenter::post(String* name, void* object, Dictionary* info,
                              NotificationPostingOptions options) {
    gLogMsg.log("Notification \"%@\",%p posted to ctr %p", name, object, mCenter);
    if (options >= 2) {
        gWarn.log(
            "A posting option other than kNotificationDeliverImmediately was chosen.  This is not "
            "available in all implementations.");
    }
    mCenter->post(name, object, info, (options & kNotificationDeliverImmediately) != 0);
}

}  // namespace Foundation
