#include <Orvane/OVNotificationCenter.h>

#include "Foundation/Guard.h"

#include <algorithm>

struct OVNotificationCenter::Entry {
    std::string name;
    const OVObject* object;
    Observer observer;

    bool wants(const OVNotification& notification) const {
        return (name.empty() || name == notification.name) &&
               (!object || object == notification.object.get());
    }
};

OVNotificationCenter& OVNotificationCenter::defaultCenter() {
    // Never destroyed: observers may go after everything else.
    static auto* const sCenter = new OVNotificationCenter;
    return *sCenter;
}

OVNotificationCenter::Observation OVNotificationCenter::addObserver(const std::string& name,
                                                                    const OVObject* object,
                                                                    Observer observer) {
    auto entry = std::make_shared<Entry>(Entry{name, object, std::move(observer)});
    std::erase_if(mEntries, [](const std::weak_ptr<Entry>& each) { return each.expired(); });
    mEntries.push_back(entry);
    return entry;
}

void OVNotificationCenter::post(const OVNotification& notification) {
    // Observers may come and go meanwhile.
    const std::vector<std::weak_ptr<Entry>> entries = mEntries;
    for (const std::weak_ptr<Entry>& each : entries) {
        const std::shared_ptr<Entry> entry = each.lock();
        if (!entry || !entry->wants(notification)) continue;
        Foundation::callGuarded("-[OVNotificationCenter post:]",
                                [&] { entry->observer(notification); });
    }
}
