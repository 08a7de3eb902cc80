#pragma once

#include "Foundation/BusMessage.h"
#include "Foundation/Uncopyable.h"

#include <cstdint>
#include <deque>
#include <memory>
#include <string>

typedef struct sd_bus sd_bus;

namespace Foundation {

/// Where a method is: a service, an object, an interface and the method's name there.
struct BusMethod {
    const char* destination;
    const char* path;
    const char* interface;
    const char* member;
    double timeoutSeconds = 25;
};

/// One connection to a message bus, from its opening until it breaks. Knows nothing of what the
/// messages are about: `Bus` does. Used on one thread.
///
/// No callback is ever left with the library beneath, which hands over every message instead; so
/// it is never inside a callback when it is called, and messages can be taken in at any depth of
/// nested runs of the loop.
class BusConnection : Uncopyable {
 public:
    using Messages = std::deque<BusMessage>;

    /// Connects, and waits for the bus's greeting. Null if nobody answers at `address`; `error`
    /// then says why.
    static std::unique_ptr<BusConnection> open(const std::string& address, std::string& error);
    ~BusConnection();

    /// The name that the bus gave this connection.
    const std::string& getUniqueName() const { return mUniqueName; }
    /// False once the connection has broken.
    bool isOpen() const;

    /// What to wait for. `deadline` is CLOCK_MONOTONIC in microseconds, -1 for none, and in the
    /// past when there is something to take in without waiting.
    void getInterest(int& fd, short& events, std::int64_t& deadline) const;
    /// Reads and writes what is ready, and adds up to `limit` messages that came to `into`.
    void pump(unsigned limit, Messages& into);

    BusMessage newCall(const BusMethod& method);
    BusMessage newSignal(const char* path, const char* interface, const char* member);

    /// Sends or, if the bus cannot take more at the moment, queues the message; it then goes out
    /// when the loop turns. With many queued, waits a while for the bus, and takes what comes
    /// meanwhile in. False, with a warning, if the message can't be sent.
    bool send(BusMessage& message, Messages& into);
    /// Waits until all is with the bus, at most `seconds`. What comes meanwhile is added to `into`.
    bool flush(double seconds, Messages& into);
    /// Calls and waits for the answer. What else comes meanwhile is kept for `pump`.
    BusMessage call(BusMessage& message, double timeoutSeconds);
    /// Answers a call with an error.
    static void replyError(const BusMessage& call, const char* name, const char* text);

 private:
    explicit BusConnection(sd_bus* bus) : mBus(bus) {}

    sd_bus* mBus;
    std::string mUniqueName;
};

}  // namespace Foundation
