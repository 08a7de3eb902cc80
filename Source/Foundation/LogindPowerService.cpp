#include "Foundation/LogindPowerService.h"

#include "Foundation/Logger.h"

#include <utility>

namespace Foundation {

namespace {

constexpr const char* kService = "org.freedesktop.login1";
constexpr const char* kPath = "/org/freedesktop/login1";
constexpr const char* kInterface = "org.freedesktop.login1.Manager";

/// logind answers at once or is in trouble, and the run loop waits.
constexpr BusMethod kInhibit = {.destination = kService,
                                .path = kPath,
                                .interface = kInterface,
                                .member = "Inhibit",
                                .timeoutSeconds = 5};

}  // namespace

class LogindPowerService::LogindSource : public Source {
 public:
    LogindSource(LogindPowerService& service, Handler handler)
        : mService(service),
          mHandler(std::move(handler)),
          mSignals(service.mBus.subscribe({.sender = kService,
                                           .path = kPath,
                                           .interface = kInterface,
                                           .member = "PrepareForSleep"},
                                          [this](BusMessage& signal) { prepareForSleep(signal); })),
          mOwner(service.mBus.watchName(
              kService, [this](const std::string&, const std::string&,
                               const std::string& newOwner) { ownerChanged(newOwner); })) {}

 private:
    void prepareForSleep(BusMessage& signal) {
        bool begins;
        if (!signal.read(begins)) return;
        if (begins) {
            mHandler(kSystemWillSleep, mService.mInhibitor.get());
            return;
        }
        // First, so that the next sleep waits even if it comes before all is done for this wake.
        mService.takeInhibitor();
        mHandler(kSystemHasPoweredOn, kNothingHeld);
    }

    /// logind has come, or come back, or the connection to the bus has: an older inhibitor may not
    /// be known any more.
    void ownerChanged(const std::string& newOwner) {
        if (!newOwner.empty()) mService.takeInhibitor();
    }

    static constexpr std::intptr_t kNothingHeld = -1;

    LogindPowerService& mService;
    const Handler mHandler;
    const BusSubscriptionPtr mSignals;
    const BusSubscriptionPtr mOwner;
};

std::unique_ptr<PowerService> LogindPowerService::open() {
    Bus& bus = Bus::system();
    if (!bus.connect()) return nullptr;
    return std::unique_ptr<PowerService>(new LogindPowerService(bus));
}

std::unique_ptr<PowerService::Source> LogindPowerService::addRunLoopSource(Handler handler) {
    auto source = std::make_unique<LogindSource>(*this, std::move(handler));
    takeInhibitor();
    return source;
}

void LogindPowerService::acknowledge(std::intptr_t argument) {
    if (mInhibitor && argument == mInhibitor.get()) mInhibitor.close();
}

void LogindPowerService::takeInhibitor() {
    BusMessage answer =
        mBus.callMethod(kInhibit, "sleep", "Orvane", "Feed downloads have to be paused", "delay");
    UniqueFD taken(answer.isValid() ? answer.readDescriptor() : -1);
    if (taken) {
        // Taken while an older one is still held, so it has another number: a late acknowledgement
        // of an earlier sleep does not give it up.
        mInhibitor = std::move(taken);
        return;
    }
    gLog.log("SleepNotifier: Can't delay the machine's sleep: %s",
             answer.isValid() ? "no descriptor came" : answer.getErrorText());
}

}  // namespace Foundation
