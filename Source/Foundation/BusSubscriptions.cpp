#include "Foundation/BusSubscriptions.h"

#include "Foundation/Guard.h"
#include "Foundation/RunLoop.h"

#include <utility>

namespace Foundation {

namespace {

constexpr const char* kBusName = "org.freedesktop.DBus";
constexpr const char* kOwnerChanged = "NameOwnerChanged";

BusMatch ownerChanges(const std::string& name) {
    BusMatch match{.sender = kBusName, .interface = kBusName, .member = kOwnerChanged};
    if (!name.empty()) match.argument0 = name;
    return match;
}

/// Whether a sender is a name that has an owner, unlike a connection's own or the bus's.
bool isWellKnown(const std::string& sender) {
    return !sender.empty() && sender[0] != ':' && sender != kBusName;
}

}  // namespace

BusSubscription::~BusSubscription() {
    mBus->remove(mID);
}

BusSubscriptionPtr Bus::add(std::shared_ptr<Subscription> subscription) {
    const bool wasConnected = isConnected();
    const std::string rule = subscription->rule;
    const int id = mNextID++;
    mSubscriptions[id] = std::move(subscription);
    // A new connection asks for all there is.
    if (wasConnected && !rule.empty()) {
        askFor(rule);
    } else {
        connect();
    }
    return BusSubscriptionPtr(new BusSubscription(this, id));
}

void Bus::remove(int id) {
    const auto found = mSubscriptions.find(id);
    if (found == mSubscriptions.end()) return;
    const std::shared_ptr<Subscription> subscription = found->second;
    mSubscriptions.erase(found);
    subscription->isOver = true;
    removeRule(subscription->rule);
    if (isWellKnown(subscription->match.sender)) endWatch(subscription->match.sender);
    if (!subscription->watchedName.empty()) endWatch(subscription->watchedName);
}

BusSubscriptionPtr Bus::subscribe(const BusMatch& match, SignalHandler handler) {
    // First, so that the owner is known before the first signal can come.
    if (isWellKnown(match.sender)) beginWatch(match.sender);
    auto subscription = std::make_shared<Subscription>();
    subscription->match = match;
    subscription->rule = match.getRule();
    subscription->signalHandler = std::move(handler);
    return add(std::move(subscription));
}

BusSubscriptionPtr Bus::handleSignals(const BusMatch& match, SignalHandler handler) {
    if (isWellKnown(match.sender)) beginWatch(match.sender);
    auto subscription = std::make_shared<Subscription>();
    subscription->match = match;
    subscription->signalHandler = std::move(handler);
    return add(std::move(subscription));
}

BusSubscriptionPtr Bus::watchName(const std::string& name, NameHandler handler) {
    auto subscription = std::make_shared<Subscription>();
    subscription->watchedName = name;
    subscription->nameHandler = std::move(handler);
    if (name.empty()) {
        subscription->rule = ownerChanges(name).getRule();
    } else {
        beginWatch(name);
    }
    return add(std::move(subscription));
}

std::string Bus::getWatchedOwner(const std::string& name) const {
    const auto found = mWatched.find(name);
    return found == mWatched.end() ? std::string() : found->second.owner;
}

bool Bus::isWatching(const std::string& name) const {
    const auto found = mWatched.find(name);
    return isConnected() && found != mWatched.end() && found->second.isTold;
}

void Bus::beginWatch(const std::string& name) {
    const bool wasConnected = isConnected();
    WatchedName& watched = mWatched[name];
    if (++watched.users > 1) return;
    if (wasConnected) {
        findOwner(name, watched);
    } else {
        connect();
    }
}

void Bus::endWatch(const std::string& name) {
    const auto found = mWatched.find(name);
    if (found == mWatched.end() || --found->second.users > 0) return;
    mWatched.erase(found);
    removeRule(ownerChanges(name).getRule());
}

void Bus::findOwner(const std::string& name, WatchedName& watched) {
    // In this order, so that no change falls between. One that comes before the answer is taken in
    // after it, and leads to the owner that the answer names or past it.
    watched.isTold = askFor(ownerChanges(name).getRule());
    watched.owner = getNameOwner(name);
}

void Bus::dispatch(BusMessage& message) {
    if (message.isSignal()) {
        if (message.isSignal({}, kBusName, kOwnerChanged) && message.getSender() == kBusName) {
            noteNameOwnerChanged(message);
        }
        dispatchSignal(message);
    } else if (message.isCall()) {
        dispatchCall(message);
    }
}

void Bus::dispatchSignal(BusMessage& signal) {
    std::vector<std::shared_ptr<Subscription>> takers;
    for (const auto& [id, subscription] : mSubscriptions) {
        const bool takesIt = subscription->signalHandler && subscription->match.matches(signal) &&
                             isFromItsSender(subscription->match, signal);
        if (takesIt) takers.push_back(subscription);
    }
    for (const std::shared_ptr<Subscription>& subscription : takers) {
        if (subscription->isOver) continue;
        signal.rewind();
        callGuarded("void Foundation::Bus::dispatchSignal(BusMessage &)",
                    [&] { subscription->signalHandler(signal); });
    }
}

bool Bus::isFromItsSender(const BusMatch& match, const BusMessage& signal) const {
    if (match.sender.empty()) return true;
    const std::string sender = signal.getSender();
    return !sender.empty() &&
           sender == (isWellKnown(match.sender) ? getWatchedOwner(match.sender) : match.sender);
}

void Bus::noteNameOwnerChanged(const BusMessage& signal) {
    const char* name = signal.getStringArgument(0);
    const char* oldOwner = signal.getStringArgument(1);
    const char* newOwner = signal.getStringArgument(2);
    if (!name || !oldOwner || !newOwner) return;
    const auto found = mWatched.find(name);
    if (found != mWatched.end()) found->second.owner = newOwner;
    tellWatchers(name, oldOwner, newOwner);
}

void Bus::tellWatchersSoon(const std::string& name, const std::string& oldOwner,
                           const std::string& newOwner) {
    onLaterTurn([=, this] { tellWatchers(name, oldOwner, newOwner); });
}

void Bus::tellWatchers(const std::string& name, const std::string& oldOwner,
                       const std::string& newOwner) {
    const Subscriptions current = mSubscriptions;
    for (const auto& [id, subscription] : current) {
        if (subscription->isOver || !subscription->nameHandler) continue;
        if (!subscription->watchedName.empty() && subscription->watchedName != name) continue;
        callGuarded("void Foundation::Bus::tellWatchers(const std::string &)",
                    [&, subscription = subscription] {
                        subscription->nameHandler(name, oldOwner, newOwner);
                    });
    }
}

}  // namespace Foundation
