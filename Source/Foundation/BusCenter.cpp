#include "Foundation/BusCenter.h"

#include "Foundation/Dictionary.h"
#include "Foundation/Logger.h"
#include "Foundation/NotificationNames.h"
#include "Foundation/PropertyListVariant.h"
#include "Foundation/RunLoop.h"
#include "Foundation/String.h"

#include <algorithm>
#include <utility>

namespace Foundation {

namespace {

std::optional<std::string> textOf(void* object) {
    if (!object) return std::nullopt;
    return static_cast<String*>(object)->utf8();
}

std::string wireForm(const String* object) {
    return object ? object->utf8() : std::string();
}

}  // namespace

bool BusCenter::Registration::wants(const std::string& postedName,
                                    const std::string& postedObject) const {
    return name == postedName && (!object || *object == postedObject);
}

void BusCenter::addObserver(void* observer, Callback callback, String* name, void* object) {
    Bus::user().onItsThread([=, this, nameText = name->utf8(), objectText = textOf(object)] {
        add({observer, callback, nameText, objectText});
    });
}

void BusCenter::begin() {
    if (mHandler) return;
    // The watch first: the agent's signals can only be told from forged ones by its owner.
    mAgentWatch = Bus::user().watchName(
        kAgentName, [](const std::string&, const std::string&, const std::string& owner) {
            gLogMsg.log("The agent is %s on the bus now", owner.empty() ? "not" : owner.c_str());
        });
    mHandler = Bus::user().handleSignals({.interface = kInterface, .member = kMember},
                                         [this](BusMessage& signal) { receive(signal); });
}

void BusCenter::add(Registration registration) {
    begin();
    registration.subscription = Bus::user().subscribe({.interface = kInterface,
                                                       .member = kMember,
                                                       .argument0 = registration.name,
                                                       .argument1 = registration.object},
                                                      nullptr);
    mRegistrations.push_back(std::move(registration));
}

template <class Condition>
void BusCenter::removeIf(Condition condition) {
    Bus::user().onItsThread([this, condition] { std::erase_if(mRegistrations, condition); });
}

void BusCenter::removeObserver(void* observer, String* name, void* object) {
    removeIf([observer, nameText = textOf(name),
              objectText = textOf(object)](const Registration& registration) {
        return registration.observer == observer && (!nameText || registration.name == *nameText) &&
               (!objectText || registration.object == objectText);
    });
}

void BusCenter::removeEveryObserver(void* observer) {
    removeObserver(observer, nullptr, nullptr);
}

void BusCenter::post(String* name, void* object, Dictionary* info, bool isUrgent) {
    Bus::user().onItsThread([this, isUrgent, name = Ref<String>(name),
                             object = Ref<String>(static_cast<String*>(object)),
                             info = Ref<Dictionary>(info)] {
        postNow(name.get(), object.get(), info.get(), isUrgent);
    });
}

void BusCenter::postNow(String* name, String* object, Dictionary* info, bool isUrgent) {
    Bus& bus = Bus::user();
    if (!bus.connect()) {
        // In a later turn, as from the bus.
        bus.onLaterTurn([this, name = Ref<String>(name), object = Ref<String>(object),
                         info = Ref<Dictionary>(info)] {
            callObservers(name.get(), object.get(), info.get());
        });
        return;
    }
    BusMessage signal = bus.newSignal(kPath, kInterface, kMember);
    signal.append(wireForm(name)).append(wireForm(object));
    PropertyListVariant::append(signal, info);
    bus.send(signal);
    if (isUrgent) bus.flush(kUrgentSeconds);
}

void BusCenter::receive(BusMessage& signal) {
    std::string name;
    std::string object;
    if (!signal.read(name) || !signal.read(object)) return;
    // One that is addressed to this process comes whether anybody here asked for it or not.
    const bool isWanted = std::any_of(
        mRegistrations.begin(), mRegistrations.end(),
        [&](const Registration& registration) { return registration.wants(name, object); });
    if (!isWanted || !isFromItsPoster(name, signal)) return;
    const Ref<String> objectString = object.empty() ? nullptr : String::string(object);
    const Ref<Dictionary> info = PropertyListVariant::read(signal);
    const Ref<String> nameString = String::string(name);
    callObservers(nameString.get(), objectString.get(), info.get());
}

bool BusCenter::isFromItsPoster(const std::string& name, const BusMessage& signal) const {
    const NotificationName* known = NotificationName::find(name);
    if (!known || known->getPoster() != NotificationName::Poster::Agent) return true;
    const std::string agent = Bus::user().getWatchedOwner(kAgentName);
    if (!agent.empty() && agent == signal.getSender()) return true;
    gLogMsg.log("Dropped notification '%s' from %s, which is not the agent", name,
                signal.getSender());
    return false;
}

void BusCenter::callObservers(String* name, String* object, Dictionary* info) {
    const std::string nameText = name->utf8();
    const std::string objectText = wireForm(object);
    std::vector<std::pair<void*, Callback>> called;
    for (const Registration& registration : mRegistrations) {
        const std::pair entry(registration.observer, registration.callback);
        if (!registration.wants(nameText, objectText)) continue;
        if (std::find(called.begin(), called.end(), entry) == called.end()) called.push_back(entry);
    }
    for (const auto& [observer, callback] : called) {
        callback(this, observer, name, object, info);
    }
}

}  // namespace Foundation
