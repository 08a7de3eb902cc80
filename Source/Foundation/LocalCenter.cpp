#include "Foundation/LocalCenter.h"

#include <algorithm>
#include <iterator>

namespace Foundation {

bool LocalCenter::Registration::wants(const String* postedName, const void* postedObject) const {
    return (!object || object == postedObject) && (!name || IsEqual(name, postedName));
}

void LocalCenter::addObserver(void* observer, Callback callback, String* name, void* object) {
    mRegistrations.push_back(
        std::make_shared<Registration>(Registration{observer, callback, name, object}));
}

template <class Condition>
void LocalCenter::removeIf(Condition condition) {
    std::erase_if(mRegistrations, [&](const std::shared_ptr<Registration>& registration) {
        if (!condition(*registration)) return false;
        registration->isOver = true;
        return true;
    });
}

void LocalCenter::removeObserver(void* observer, String* name, void* object) {
    removeIf([&](const Registration& registration) {
        return registration.observer == observer && (!object || registration.object == object) &&
               (!name || IsEqual(registration.name, name));
    });
}

void LocalCenter::removeEveryObserver(void* observer) {
    removeIf([&](const Registration& registration) { return registration.observer == observer; });
}

void LocalCenter::post(String* name, void* object, Dictionary* info, bool) {
    Registrations called;
    std::copy_if(mRegistrations.begin(), mRegistrations.end(), std::back_inserter(called),
                 [&](const auto& registration) { return registration->wants(name, object); });
    for (const std::shared_ptr<Registration>& registration : called) {
        if (registration->isOver) continue;
        registration->callback(this, registration->observer, name, object, info);
    }
}

}  // namespace Foundation
