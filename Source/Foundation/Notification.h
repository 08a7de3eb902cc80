#pragma once

#include "Foundation/Action.h"

namespace Foundation {

class Dictionary;
class String;

/// A change of interest, as its receivers get it. Lives for the time of a delivery, and so do the
/// three values unless a receiver retains them.
struct Notification {
    String* name;
    void* object;      ///< who posted it; a `String` if it came from the distributed centre
    Dictionary* info;  ///< may be null

    /// The object, which must have been posted as a T.
    template <class T>
    T* getObject() const {
        return static_cast<T*>(object);
    }
};

/// Receives notifications. Its owner removes it from the centres before it ends.
using NotificationReceiver = Orvane::ActionOf<Notification>::ReceiverOf;

/// How to post. Other values may be given, and draw a warning.
enum NotificationPostingOptions : unsigned {
    kNotificationDeliverImmediately = 1,  ///< it is with the bus when the post returns
};

}  // namespace Foundation
