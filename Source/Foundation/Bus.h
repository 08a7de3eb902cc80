#pragma once

#include "Foundation/BusConnection.h"
#include "Foundation/BusMatch.h"
#include "Foundation/Ref.h"
#include "Foundation/RunLoopSource.h"
#include "Foundation/RunLoopTimer.h"

#include <functional>
#include <list>
#include <map>
#include <memory>
#include <set>
#include <string>
#include <vector>

namespace Foundation {

class Bus;

/// What somebody asked of a bus; ends it with its own end. The bus's thread.
class BusSubscription : Uncopyable {
 public:
    ~BusSubscription();

 private:
    friend class Bus;
    BusSubscription(Bus* bus, int id) : mBus(bus), mID(id) {}

    Bus* mBus;
    int mID;
};
using BusSubscriptionPtr = std::unique_ptr<BusSubscription>;

/// The process's connection to a message bus, on the run loop of the thread that first used it, in
/// the common modes. It connects on first use. Every operation but these two, `onItsThread` and
/// `onLaterTurn`, belongs to that thread.
///
/// What arrives is delivered in turns of the loop, in the order in which the bus sent it, never
/// from inside another operation; a run of the loop inside a delivery goes on with the next
/// message. At most `kMessagesPerTurn` are delivered in a turn.
///
/// When the connection breaks or none can be had, that is logged once, and the loop tries again
/// after `kFirstRetrySeconds`, then after twice as long each time up to `kLongestRetrySeconds`.
/// Until then calls fail and nothing is sent. A new connection has the subscriptions and the names
/// of the old one.
class Bus : RunLoopSource {
 public:
    using SignalHandler = std::function<void(BusMessage& signal)>;
    using CallHandler = std::function<void(BusMessage& call)>;
    /// An owner is a unique name, or empty for none.
    using NameHandler = std::function<void(const std::string& name, const std::string& oldOwner,
                                           const std::string& newOwner)>;

    static constexpr unsigned kMessagesPerTurn = 64;
    static constexpr double kFirstRetrySeconds = 0.25;
    static constexpr double kLongestRetrySeconds = 30;
    static constexpr double kBusTimeoutSeconds = 10;  ///< for calls of the bus itself

    /// The user's bus, which `BusLauncher` starts where there is none. Never ends.
    static Bus& user();
    /// The machine's bus. Never ends.
    static Bus& system();

    /// Calls `function` on the bus's thread: at once there, in a turn of its loop elsewhere.
    void onItsThread(std::function<void()> function);
    /// Calls `function` in a later turn of the bus's loop. Any thread.
    void onLaterTurn(std::function<void()> function);

    /// Whether there is a connection. Makes one if none was tried for yet, or it was closed.
    bool connect();
    bool isConnected() const { return mConnection && mConnection->isOpen(); }
    /// Ends the connection, as the end of the process would, after giving what is queued
    /// `kBusTimeoutSeconds` to go out. The next use makes a new one.
    void close();
    /// This connection's unique name; empty without one.
    std::string getUniqueName();

    /// Calls a method and waits for the answer, without turning the loop. A failure, of whatever
    /// side, is an answer that is not valid and has an error name.
    template <class... Args>
    BusMessage callMethod(const BusMethod& method, const Args&... arguments) {
        BusMessage message = newCall(method);
        (message.append(arguments), ...);
        return call(message, method.timeoutSeconds);
    }
    BusMessage newCall(const BusMethod& method);
    BusMessage call(BusMessage& message, double timeoutSeconds);

    /// A signal for everybody. Not valid without a connection.
    BusMessage newSignal(const char* path, const char* interface, const char* member);
    /// Sends it, or queues it where the bus cannot take it yet. False, with a warning, if it is
    /// lost.
    bool send(BusMessage& message);
    /// Waits until what was sent is with the bus, at most `seconds`.
    bool flush(double seconds);

    /// Asks the bus for the signals that match, and calls `handler` with each. A null handler only
    /// asks for them: that of another subscription takes them, and once even if several match.
    /// Where the match names a sender, signals of others do not count.
    [[nodiscard]] BusSubscriptionPtr subscribe(const BusMatch& match, SignalHandler handler);
    /// Takes the matching signals that others ask the bus for.
    [[nodiscard]] BusSubscriptionPtr handleSignals(const BusMatch& match, SignalHandler handler);

    /// Calls `handler` with the calls of methods of the object at `path`, which it is to answer, at
    /// once or later: `send` with the call's `newReply`, or `replyError`. A call that makes it
    /// throw is answered with an error. Objects above it in the tree answer to introspection.
    [[nodiscard]] BusSubscriptionPtr handleCalls(const std::string& path, CallHandler handler);
    /// Answers a call with an error.
    void replyError(const BusMessage& call, const char* name, const std::string& text);
    /// Delivers all that has come by now.
    void deliverArrived();

    /// Makes this connection the owner of a well-known name. False if another owns it, who keeps
    /// it, or there is no bus. A new connection takes the name again, or then.
    bool requestName(const std::string& name);
    void releaseName(const std::string& name);
    /// The unique name of the owner, empty if there is none.
    std::string getNameOwner(const std::string& name);
    /// The process behind a name; 0 if there is none, or it is not known.
    std::uint32_t getProcessID(const std::string& name);
    /// Whether the bus can start who owns the name.
    bool canStart(const std::string& name);
    /// All names on the bus, unique ones included. Empty without a bus.
    std::vector<std::string> listNames();
    /// Calls `handler` whenever the owner of `name` changes from what `getWatchedOwner` gives at
    /// first. When the connection breaks, its owner is gone; the next one tells who owns it then.
    ///
    /// An empty name stands for all names. The handler is then called with an empty name, too, when
    /// the connection breaks or is back, for anything may have changed.
    [[nodiscard]] BusSubscriptionPtr watchName(const std::string& name, NameHandler handler);
    /// The owner of a watched name as of the message that is being delivered, which `getNameOwner`
    /// may be ahead of.
    std::string getWatchedOwner(const std::string& name) const;
    /// Whether the owner of a watched name is told: there is a connection, and the bus has agreed.
    bool isWatching(const std::string& name) const;

 private:
    friend class BusSubscription;
    struct Subscription;
    struct WatchedName {
        int users = 0;
        bool isTold = false;  ///< the bus has agreed
        std::string owner;
    };
    using Subscriptions = std::map<int, std::shared_ptr<Subscription>>;

    explicit Bus(bool isSystem) : mIsSystem(isSystem) {}

    Interest interest() noexcept override;
    void ready(short events) override;
    bool isReentrant() const noexcept override { return true; }

    void joinLoop();
    std::unique_ptr<BusConnection> open(std::string& error) const;
    bool tryToConnect(bool isRetry);
    void scheduleRetry();
    void noteLoss();
    void setUp(bool isRetry);

    BusSubscriptionPtr add(std::shared_ptr<Subscription> subscription);
    void remove(int id);
    bool askFor(const std::string& rule);
    void removeRule(const std::string& rule);
    void beginWatch(const std::string& name);
    void endWatch(const std::string& name);
    void findOwner(const std::string& name, WatchedName& watched);

    void dispatch(BusMessage& message);
    void dispatchSignal(BusMessage& signal);
    void dispatchCall(BusMessage& call);
    std::string describeBelow(const std::string& path) const;
    bool isFromItsSender(const BusMatch& match, const BusMessage& signal) const;
    void noteNameOwnerChanged(const BusMessage& signal);
    void tellWatchersSoon(const std::string& name, const std::string& oldOwner,
                          const std::string& newOwner);
    void tellWatchers(const std::string& name, const std::string& oldOwner,
                      const std::string& newOwner);

    const bool mIsSystem;
    std::unique_ptr<BusConnection> mConnection;
    BusConnection::Messages mIncoming;  ///< not delivered yet
    Ref<RunLoopTimer> mRetryTimer;
    double mRetrySeconds = kFirstRetrySeconds;
    bool mHasComplained = false;

    Subscriptions mSubscriptions;
    int mNextID = 1;
    std::map<std::string, WatchedName> mWatched;  ///< by name
    std::set<std::string> mNames;                 ///< requested, to be had again
};

}  // namespace Foundation
