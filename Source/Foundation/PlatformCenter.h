#pragma once

#include "Foundation/Uncopyable.h"

namespace Foundation {

class Dictionary;
class String;

/// What a `NotificationCenter` stands on: brings notifications from who posts them to callbacks.
///
/// A registration is for a name and an object; null stands for any of them. An observer is no more
/// than a pointer that tells registrations apart.
class PlatformCenter : Uncopyable {
 public:
    using Callback = void (*)(PlatformCenter* center, void* observer, String* name, void* object,
                              Dictionary* info);

    virtual ~PlatformCenter() = default;

    virtual void addObserver(void* observer, Callback callback, String* name, void* object) = 0;
    /// Ends the observer's registrations for this name and object; null leaves one out of account.
    virtual void removeObserver(void* observer, String* name, void* object) = 0;
    /// Ends all of the observer's registrations.
    virtual void removeEveryObserver(void* observer) = 0;
    /// `isUrgent`: what was posted is on its way when this returns, as far as that depends on us.
    virtual void post(String* name, void* object, Dictionary* info, bool isUrgent) = 0;
};

}  // namespace Foundation
