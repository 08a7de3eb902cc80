#pragma once

#include "Foundation/Bus.h"
#include "Foundation/PlatformCenter.h"

#include <optional>
#include <string>
#include <vector>

namespace Foundation {

/// Distributed notifications on the user's message bus.
///
/// A post is the signal "Posted" of the interface "com.tarnwick.orvane.Notification" on the object
/// "/com/tarnwick/orvane/Notification", with the arguments "ssa{sv}": the name, the object and the
/// info in the form of `PropertyListVariant`. A null object is the empty string, so an empty string
/// arrives as null. An observer with a sender is told only of posts by that object.
///
/// An observer is called once for a post, however many of its registrations want it. It is called
/// on the bus's thread, in a turn of its loop.
///
/// Anybody can send such a signal, also to one process alone. What only the agent posts
/// (`NotificationName::Poster::Agent`) therefore counts only if it comes from whoever owned the
/// agent's name when the bus took it in; all else under these names is dropped.
///
/// Where no bus can be had, the process still hears what it posts itself.
///
/// Any thread, inside a pool. On the bus's own thread an observer hears everything that is posted
/// after its registration; on another one the bus is asked in the next turn of its thread's loop.
class BusCenter : public PlatformCenter {
 public:
    static constexpr const char* kPath = "/com/tarnwick/orvane/Notification";
    static constexpr const char* kInterface = "com.tarnwick.orvane.Notification";
    static constexpr const char* kMember = "Posted";
    static constexpr const char* kAgentName = "com.tarnwick.orvane.ipc";
    /// How long an urgent post waits for a bus that does not read.
    static constexpr double kUrgentSeconds = 2;

    /// REQUIRES: `name` is not null, and `object` a `String` or null.
    void addObserver(void* observer, Callback callback, String* name, void* object) override;
    void removeObserver(void* observer, String* name, void* object) override;
    void removeEveryObserver(void* observer) override;
    void post(String* name, void* object, Dictionary* info, bool isUrgent) override;

 private:
    struct Registration {
        void* observer;
        Callback callback;
        std::string name;
        std::optional<std::string> object;
        BusSubscriptionPtr subscription = nullptr;

        bool wants(const std::string& postedName, const std::string& postedObject) const;
    };

    // All of these, and the fields, belong to the bus's thread.
    void begin();
    void add(Registration registration);
    template <class Condition>
    void removeIf(Condition condition);
    void postNow(String* name, String* object, Dictionary* info, bool isUrgent);
    void receive(BusMessage& signal);
    bool isFromItsPoster(const std::string& name, const BusMessage& signal) const;
    void callObservers(String* name, String* object, Dictionary* info);

    BusSubscriptionPtr mAgentWatch;
    BusSubscriptionPtr mHandler;
    std::vector<Registration> mRegistrations;
};

}  // namespace Foundation
