// A second process for the tests of notifications, and of the bus that programs start themselves.
//
//   send NAME COUNT      posts COUNT notifications, with the numbers from 0 as their objects
//   receive NAME COUNT   observes NAME, says "ready", reads standard input to its end without
//                        turning its loop, then says what came: "COUNT in order" or the first error
//   relay NAME COUNT     the same with the bus on a thread of its own
//   connect              says the identifier of the bus that it found or started, or why not, and
//                        waits for the end of standard input

#include "Foundation/Bus.h"
#include "Foundation/DictionaryOf.h"
#include "Foundation/DistributedNotificationCenter.h"
#include "Foundation/Number.h"
#include "Foundation/RunLoop.h"
#include "Foundation/String.h"

#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <latch>
#include <string>
#include <thread>

using namespace Foundation;

namespace {

void say(const std::string& line) {
    std::printf("%s\n", line.c_str());
    std::fflush(stdout);
}

void awaitEndOfInput() {
    char block[256];
    while (read(STDIN_FILENO, block, sizeof block) > 0) {
    }
}

/// Checks that the numbers come in order.
class Receiver {
 public:
    Receiver(String* name, long count) : mCount(count) {
        NotificationCenter::getDistributed()->addObserver(&mReceiver, name, nullptr);
    }
    ~Receiver() { NotificationCenter::getDistributed()->removeObserver(&mReceiver); }

    std::string run() {
        while (mNext < mCount && mError.empty()) {
            RunLoop::current().run();
        }
        return mError.empty() ? std::to_string(mNext) + " in order" : mError;
    }

 private:
    void receive(Notification* notification) {
        const std::string expected = std::to_string(mNext);
        const auto* number = notification->info->getAs<Number>("number");
        if (notification->getObject<String>()->view() != expected ||
            Number::getInteger(number) != mNext) {
            mError = notification->getObject<String>()->utf8() + " instead of " + expected;
        }
        if (++mNext == mCount || !mError.empty()) RunLoop::current().stop();
    }

    const long mCount;
    long mNext = 0;
    std::string mError;
    Orvane::MethodReceiver<Notification, Receiver> mReceiver{this, &Receiver::receive};
};

int send(String* name, long count) {
    for (long i = 0; i < count; ++i) {
        AutoreleasePool pool;
        auto info = Ref<MutableDictionaryOf<String, Number>>(
            MutableDictionaryOf<String, Number>::dictionary());
        info->set("number", Number::number(i));
        String* object = String::string(std::to_string(i));
        NotificationCenter::getDistributed()->post(name, object, info.get());
    }
    return Bus::user().flush(60) ? 0 : 1;
}

int receive(String* name, long count) {
    Receiver receiver(name, count);
    // On another thread the bus is asked in a turn of that thread's loop.
    std::latch hasAsked(1);
    Bus::user().onItsThread([&] { hasAsked.count_down(); });
    hasAsked.wait();
    say("ready");
    awaitEndOfInput();
    say(receiver.run());
    return 0;
}

int relay(String* name, long count) {
    std::latch hasBus(1);
    RunLoop* loop = nullptr;
    std::thread thread([&] {
        loop = &RunLoop::current();
        Bus::user();
        hasBus.count_down();
        loop->run();
    });
    hasBus.wait();
    const int result = receive(name, count);
    loop->perform([&] { loop->stop(); });
    thread.join();
    return result;
}

int connect() {
    BusMessage reply = Bus::user().callMethod(
        {"org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus", "GetId"});
    std::string identifier;
    say(reply.read(identifier) ? identifier : "no bus: " + reply.getErrorText());
    awaitEndOfInput();
    return 0;
}

}  // namespace

int main(int argc, char** argv) {
    const std::string command = argc > 1 ? argv[1] : "";
    if (command == "connect") return connect();
    if (argc != 4) return 2;
    const Ref<String> name = String::string(argv[2]);
    const long count = std::atol(argv[3]);
    if (command == "send") return send(name.get(), count);
    if (command == "receive") return receive(name.get(), count);
    return command == "relay" ? relay(name.get(), count) : 2;
}
