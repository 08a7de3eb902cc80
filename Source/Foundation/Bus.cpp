#include "Foundation/Bus.h"

#include "Foundation/BusLauncher.h"
#include "Foundation/BusSubscriptions.h"
#include "Foundation/Clock.h"
#include "Foundation/Logger.h"
#include "Foundation/RunLoop.h"

#include <algorithm>
#include <mutex>
#include <utility>

namespace Foundation {

namespace {

const char* nameOfBus(bool isSystem) {
    return isSystem ? "the system's message bus" : "the user's message bus";
}

BusMethod busMethod(const char* member) {
    return {"org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus", member,
            Bus::kBusTimeoutSeconds};
}

}  // namespace

Bus& Bus::user() {
    // Never destroyed: objects that end with the process use it.
    static Bus* const sBus = new Bus(false);
    sBus->joinLoop();
    return *sBus;
}

Bus& Bus::system() {
    static Bus* const sBus = new Bus(true);
    sBus->joinLoop();
    return *sBus;
}

void Bus::joinLoop() {
    static std::mutex sMutex;
    const std::lock_guard lock(sMutex);
    if (!getLoop()) addTo(RunLoop::current(), RunLoop::kCommonModes);
}

void Bus::onItsThread(std::function<void()> function) {
    if (getLoop() == &RunLoop::current()) {
        function();
    } else {
        getLoop()->perform(std::move(function));
    }
}

void Bus::onLaterTurn(std::function<void()> function) {
    getLoop()->perform(std::move(function));
}

bool Bus::connect() {
    if (isConnected()) return true;
    // A broken connection is for the loop to find, after what it had still brought.
    if (mConnection || mRetryTimer) return false;
    return tryToConnect(false);
}

std::unique_ptr<BusConnection> Bus::open(std::string& error) const {
    if (mIsSystem) return BusConnection::open(BusLauncher::getSystemAddress(), error);
    for (const std::string& address : BusLauncher::getAddresses()) {
        if (auto connection = BusConnection::open(address, error)) return connection;
    }
    const std::string own = BusLauncher::startOwn(error);
    return own.empty() ? nullptr : BusConnection::open(own, error);
}

bool Bus::tryToConnect(bool isRetry) {
    std::string error;
    mConnection = open(error);
    if (!mConnection) {
        if (!std::exchange(mHasComplained, true)) {
            gWarn.log("Can't connect to %s: %s", nameOfBus(mIsSystem), error);
        }
        scheduleRetry();
        return false;
    }
    mRetrySeconds = kFirstRetrySeconds;
    if (std::exchange(mHasComplained, false)) {
        gWarn.log("Connected to %s again", nameOfBus(mIsSystem));
    }
    setUp(isRetry);
    return isConnected();
}

void Bus::setUp(bool isRetry) {
    // The owners first, so that they are known before signals can come that depend on them.
    for (auto& [name, watched] : mWatched) {
        findOwner(name, watched);
        if (isRetry && !watched.owner.empty()) tellWatchersSoon(name, {}, watched.owner);
    }
    for (const auto& [id, subscription] : mSubscriptions) {
        if (!subscription->rule.empty()) askFor(subscription->rule);
    }
    // A copy, for a name that another has is not asked for again.
    const std::set<std::string> names = mNames;
    for (const std::string& name : names) {
        requestName(name);
    }
    if (isRetry) tellWatchersSoon({}, {}, {});
}

void Bus::scheduleRetry() {
    mRetryTimer = Returner<RunLoopTimer>::adopted(
        new RunLoopTimer(Clock::current().now() + mRetrySeconds, 0, [this] {
            mRetryTimer = nullptr;
            tryToConnect(true);
        }));
    mRetrySeconds = std::min(mRetrySeconds * 2, kLongestRetrySeconds);
    getLoop()->addTimer(mRetryTimer, RunLoop::kCommonModes);
}

void Bus::noteLoss() {
    mConnection.reset();
    if (!std::exchange(mHasComplained, true)) {
        gWarn.log("Lost the connection to %s", nameOfBus(mIsSystem));
    }
    for (auto& [name, watched] : mWatched) {
        const std::string owner = std::exchange(watched.owner, {});
        if (!owner.empty()) tellWatchersSoon(name, owner, {});
    }
    tellWatchersSoon({}, {}, {});
    scheduleRetry();
}

void Bus::close() {
    if (isConnected()) flush(kBusTimeoutSeconds);
    mConnection.reset();
    mIncoming.clear();
    // Moved out, since what an assignment replaces would go to a pool, and there may be none.
    const Ref<RunLoopTimer> timer = std::move(mRetryTimer);
    if (timer) timer->invalidate();
    mRetrySeconds = kFirstRetrySeconds;
    mHasComplained = false;
    for (auto& [name, watched] : mWatched) {
        watched.owner.clear();
    }
}

std::string Bus::getUniqueName() {
    return connect() ? mConnection->getUniqueName() : std::string();
}

BusMessage Bus::newCall(const BusMethod& method) {
    return connect() ? mConnection->newCall(method) : BusMessage();
}

BusMessage Bus::call(BusMessage& message, double timeoutSeconds) {
    if (!connect()) {
        return BusMessage::failure("org.freedesktop.DBus.Error.Disconnected",
                                   std::string("No connection to ") + nameOfBus(mIsSystem));
    }
    return mConnection->call(message, timeoutSeconds);
}

BusMessage Bus::newSignal(const char* path, const char* interface, const char* member) {
    return connect() ? mConnection->newSignal(path, interface, member) : BusMessage();
}

bool Bus::send(BusMessage& message) {
    return isConnected() && mConnection->send(message, mIncoming);
}

bool Bus::flush(double seconds) {
    return isConnected() && mConnection->flush(seconds, mIncoming);
}

bool Bus::requestName(const std::string& name) {
    mNames.insert(name);
    constexpr std::uint32_t kDoNotQueue = 4;
    constexpr std::uint32_t kIsOwner = 1;
    constexpr std::uint32_t kWasOwner = 4;
    BusMessage reply = callMethod(busMethod("RequestName"), name, kDoNotQueue);
    std::uint32_t result = 0;
    const bool isOurs =
        reply.isValid() && reply.read(result) && (result == kIsOwner || result == kWasOwner);
    if (reply.isValid() && !isOurs) mNames.erase(name);
    return isOurs;
}

void Bus::releaseName(const std::string& name) {
    if (mNames.erase(name) && isConnected()) callMethod(busMethod("ReleaseName"), name);
}

std::string Bus::getNameOwner(const std::string& name) {
    BusMessage reply = callMethod(busMethod("GetNameOwner"), name);
    std::string owner;
    if (reply.isValid()) reply.read(owner);
    return owner;
}

std::uint32_t Bus::getProcessID(const std::string& name) {
    BusMessage reply = callMethod(busMethod("GetConnectionUnixProcessID"), name);
    std::uint32_t process = 0;
    if (reply.isValid()) reply.read(process);
    return process;
}

bool Bus::canStart(const std::string& name) {
    BusMessage reply = callMethod(busMethod("ListActivatableNames"));
    std::vector<std::string> names;
    if (reply.isValid()) reply.read(names);
    return std::find(names.begin(), names.end(), name) != names.end();
}

std::vector<std::string> Bus::listNames() {
    BusMessage reply = callMethod(busMethod("ListNames"));
    std::vector<std::string> names;
    if (reply.isValid()) reply.read(names);
    return names;
}

bool Bus::askFor(const std::string& rule) {
    const BusMessage reply = callMethod(busMethod("AddMatch"), rule);
    if (reply.isValid()) return true;
    gWarn.log("Can't ask %s for signals (%s): %s", nameOfBus(mIsSystem), rule,
              reply.getErrorText());
    return false;
}

void Bus::removeRule(const std::string& rule) {
    if (!rule.empty() && isConnected()) callMethod(busMethod("RemoveMatch"), rule);
}

RunLoopSource::Interest Bus::interest() noexcept {
    Interest wanted;
    wanted.readyNow = !mIncoming.empty();
    if (mConnection) mConnection->getInterest(wanted.fd, wanted.events, wanted.deadline);
    return wanted;
}

void Bus::ready(short) {
    if (mConnection && mIncoming.size() < kMessagesPerTurn) {
        mConnection->pump(kMessagesPerTurn, mIncoming);
    }
    // A delivery may turn the loop and so deliver what follows: each looks at the queue anew.
    for (unsigned count = 0; count < kMessagesPerTurn && !mIncoming.empty(); ++count) {
        BusMessage message = std::move(mIncoming.front());
        mIncoming.pop_front();
        dispatch(message);
    }
    if (mConnection && !mConnection->isOpen() && mIncoming.empty()) noteLoss();
}

void Bus::deliverArrived() {
    do {
        ready(0);
        if (mConnection && mIncoming.empty()) mConnection->pump(kMessagesPerTurn, mIncoming);
    } while (!mIncoming.empty());
}

}  // namespace Foundation
