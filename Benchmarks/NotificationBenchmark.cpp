// How long is a distributed notification on its way, next to a bare signal on the same bus?
//
// Both are posted and received by this process, through the bus, one at a time.

#include "Benchmarks/Measure.h"
#include "Foundation/BusCenter.h"
#include "Foundation/DistributedNotificationCenter.h"
#include "Foundation/Logger.h"
#include "Foundation/RunLoop.h"
#include "Foundation/String.h"
#include "Support/PrivateBus.h"

#include <systemd/sd-bus.h>

#include <cstdlib>
#include <limits>

using namespace Foundation;

namespace {

constexpr int kCount = 500;
constexpr const char* kName = "com.tarnwick.orvane.benchmark";

/// Posts and waits for the delivery.
class Notifications {
 public:
    Notifications() { mCenter->addObserver(&mReceiver, mName.get(), nullptr); }
    ~Notifications() { mCenter->removeObserver(&mReceiver); }

    void roundTrips() {
        for (int i = 0; i < kCount; ++i) {
            AutoreleasePool pool;
            mHasCome = false;
            mCenter->post(mName.get(), mObject.get(), nullptr, kNotificationDeliverImmediately);
            while (!mHasCome) {
                RunLoop::current().runInMode(RunLoop::kDefaultMode,
                                             std::numeric_limits<double>::infinity(), true);
            }
        }
    }

 private:
    void receive(Notification*) { mHasCome = true; }

    DistributedNotificationCenter* mCenter = NotificationCenter::getDistributed();
    Ref<String> mName = String::string(kName);
    Ref<String> mObject = String::string("1234");
    bool mHasCome = false;
    Orvane::MethodReceiver<Notification, Notifications> mReceiver{this, &Notifications::receive};
};

/// The same with nothing between the program and the library.
class BareSignals {
 public:
    explicit BareSignals(const char* address) {
        sd_bus_new(&mBus);
        sd_bus_set_address(mBus, address);
        sd_bus_set_bus_client(mBus, 1);
        sd_bus_start(mBus);
        const int result = sd_bus_match_signal(mBus, nullptr, nullptr, nullptr, "bare.Interface",
                                               "Posted", receive, this);
        if (result < 0) std::abort();
    }
    ~BareSignals() { sd_bus_flush_close_unref(mBus); }

    void roundTrips() {
        for (int i = 0; i < kCount; ++i) {
            mHasCome = false;
            sd_bus_emit_signal(mBus, BusCenter::kPath, "bare.Interface", "Posted", "ssa{sv}", kName,
                               "1234", 0);
            while (!mHasCome) {
                if (sd_bus_process(mBus, nullptr) == 0) sd_bus_wait(mBus, UINT64_MAX);
            }
        }
    }

 private:
    static int receive(sd_bus_message*, void* self, sd_bus_error*) {
        static_cast<BareSignals*>(self)->mHasCome = true;
        return 0;
    }

    sd_bus* mBus = nullptr;
    bool mHasCome = false;
};

}  // namespace

int main() {
    AutoreleasePool pool;
    const Support::PrivateBus bus;
    Notifications notifications;
    BareSignals bare(bus.getAddress().c_str());
    const auto c =
        Benchmarks::compare([&] { notifications.roundTrips(); }, [&] { bare.roundTrips(); });
    Benchmarks::report("a notification to the process itself", c, kCount, "a bare signal");
    std::printf("notification_latency %.2f\n", c.ratio());
}
