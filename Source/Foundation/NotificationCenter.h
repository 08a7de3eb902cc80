#pragma once

#include "Foundation/Notification.h"
#include "Foundation/PlatformCenter.h"
#include "Foundation/Uncopyable.h"

namespace Foundation {

class DistributedNotificationCenter;

/// Where changes are announced by name, and observers of them are called. Used on the run-loop
/// thread.
class NotificationCenter : Uncopyable {
 public:
    /// The process's local centre.
    static NotificationCenter* getLocal();
    /// The centre that reaches all processes of the user.
    static DistributedNotificationCenter* getDistributed();

    virtual ~NotificationCenter() = default;

    /// Calls the receiver with every notification of this name and object; null stands for any.
    /// The receiver stays the caller's, who removes it before it ends.
    virtual void addObserver(NotificationReceiver* receiver, String* name, void* object);
    /// Ends the receiver's registrations for this name and object; null leaves one out of account.
    virtual void removeObserver(NotificationReceiver* receiver, String* name, void* object);
    /// Ends all of the receiver's registrations.
    virtual void removeObserver(NotificationReceiver* receiver);

    /// Announces. What receivers throw is reported and stops there. In the local centre they have
    /// all been called when this returns.
    void post(String* name, void* object, Dictionary* info,
              NotificationPostingOptions options = {});

 protected:
    explicit NotificationCenter(PlatformCenter* center) : mCenter(center) {}

    PlatformCenter* const mCenter;
};

}  // namespace Foundation
