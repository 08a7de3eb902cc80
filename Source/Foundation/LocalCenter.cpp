#include "Foundation/LocalCenter.h"

#include <algorithm>

namespace Foundation {

void LocalCenter::addObserver(void* observer, Callback callback, String* name, void* object) {
    const auto registration = std::make_shared<Registration>(Registration{
        observer, callback, std::string(String::view(name)), name == nullptr, object, ++mOrder});
    Ordered& list = name ? mByName[registration->name] : mOfAnyName;
    list.emplace(registration->order, registration);
    mByObserver[observer].push_back(registration);
}

template <class Condition>
void LocalCenter::removeIf(void* observer, Condition condition) {
    const auto found = mByObserver.find(observer);
    if (found == mByObserver.end()) return;
    std::erase_if(found->second, [&](const RegistrationPointer& registration) {
        if (!condition(*registration)) return false;
        registration->isOver = true;
        forget(*registration);
        return true;
    });
    if (found->second.empty()) mByObserver.erase(found);
}

/// Takes it out of the lists by name.
void LocalCenter::forget(const Registration& registration) {
    if (registration.isOfAnyName) {
        mOfAnyName.erase(registration.order);
        return;
    }
    const auto list = mByName.find(registration.name);
    list->second.erase(registration.order);
    if (list->second.empty()) mByName.erase(list);
}

void LocalCenter::removeObserver(void* observer, String* name, void* object) {
    removeIf(observer, [&](const Registration& registration) {
        return (!object || registration.object == object) &&
               (!name || (!registration.isOfAnyName && registration.name == name->view()));
    });
}

void LocalCenter::removeEveryObserver(void* observer) {
    removeIf(observer, [](const Registration&) { return true; });
}

/// Whoever wants such a post, in the order of registration.
LocalCenter::Registrations LocalCenter::findFor(const String* name, const void* object) const {
    Registrations found;
    const auto add = [&](const Ordered& list) {
        for (const auto& [order, registration] : list) {
            if (registration->wants(object)) found.push_back(registration);
        }
    };
    const auto named = name ? mByName.find(name->view()) : mByName.end();
    if (named != mByName.end()) add(named->second);
    const auto middle = static_cast<std::ptrdiff_t>(found.size());
    add(mOfAnyName);
    std::inplace_merge(found.begin(), found.begin() + middle, found.end(),
                       [](const auto& a, const auto& b) { return a->order < b->order; });
    return found;
}

void LocalCenter::post(String* name, void* object, Dictionary* info, bool) {
    for (const RegistrationPointer& registration : findFor(name, object)) {
        if (registration->isOver) continue;
        registration->callback(this, registration->observer, name, object, info);
    }
}

}  // namespace Foundation
