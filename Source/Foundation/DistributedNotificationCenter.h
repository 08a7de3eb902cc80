#pragma once

#include "Foundation/NotificationCenter.h"
#include "Foundation/Ref.h"

#include <map>
#include <set>
#include <string>
#include <vector>

namespace Foundation {

/// The centre between processes: what is posted here reaches every process of the user, the poster
/// included. The object is a `String` and the info a property list.
///
/// A notification comes to its receivers in two legs. The platform brings it to the process, on
/// whatever thread; the process's `NotificationMessagePort` relays it into the run loop of the
/// thread that observed first, where it is posted on the local centre. So receivers are always
/// called in a turn of that loop, never from inside the post.
class DistributedNotificationCenter : public NotificationCenter {
 public:
    /// The centre over the user's message bus (`BusCenter`).
    static DistributedNotificationCenter* instance();
    /// Puts another in its place, for tests, and gives the one before; null for the one above.
    static DistributedNotificationCenter* setInstance(DistributedNotificationCenter* center);

    /// `center` must outlive this.
    explicit DistributedNotificationCenter(PlatformCenter* center) : NotificationCenter(center) {}

    /// The one instance that stands for all strings of this text; null for null. It lives as long
    /// as this. The local centre compares objects by address, so every string that is to be the
    /// object of a registration or a delivery passes through here.
    String* getCanonicalString(String* string);

    /// The first observer of a name and sender subscribes to the platform for the process. Throws
    /// `AssertionFailure` for a null name.
    void addObserver(NotificationReceiver* receiver, String* name, void* object) override;
    /// The platform's subscription stays, so that observers can come and go cheaply.
    void removeObserver(NotificationReceiver* receiver, String* name, void* object) override;
    void removeObserver(NotificationReceiver* receiver) override;

    /// Posts what has arrived on the local centre. On the thread of the relay's loop.
    void deliver(const Notification* notification);

 private:
    struct Sender {
        Ref<String> string;
        bool isKept = false;  ///< not just for the time of a delivery
    };

    void subscribe(String* name, String* sender);

    /// A name, or a name and a sender: one subscription to the platform each.
    std::set<std::vector<std::string>> mRegistrations;
    std::map<std::string, Sender> mSenders;  ///< canonical strings, by text
};

}  // namespace Foundation
