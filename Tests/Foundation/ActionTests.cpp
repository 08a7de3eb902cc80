#include "Foundation/Action.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Ref.h"
#include "Foundation/Tracked.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <future>
#include <stdexcept>
#include <thread>

using namespace Foundation;
using namespace Orvane;
using Support::LogCapture;

namespace {

struct Sender {
    int value = 0;
};

struct Target {
    Sender* received = nullptr;
    std::uint32_t poolLevel = 0;

    void take(Sender* sender) {
        received = sender;
        poolLevel = AutoreleasePool::getNestLevel();
    }
    void fail(Sender*) { throw std::runtime_error("no good"); }
    void failOddly(Sender*) { throw 42; }
};

void addTo(Sender* sender, int amount) {
    sender->value += amount;
}

// By value, as a receiver passes it: each call holds a counted copy.
void noteCount(Sender* sender, Ref<PFRefCounted> context) {  // NOLINT
    sender->value = static_cast<int>(context->getRetainCount());
}

}  // namespace

TEST(Action, CallsAMethodWithTheSenderInsideAPool) {
    Target target;
    Sender sender;
    ActionOf<Sender> action;
    action.setReceiver(receiver(&target, &Target::take));
    action.invoke(&sender);
    EXPECT_EQ(target.received, &sender);
    EXPECT_EQ(target.poolLevel, 1u);
    EXPECT_EQ(AutoreleasePool::getNestLevel(), 0u);
}

TEST(Action, CallsAFunctionWithItsContext) {
    Sender sender;
    ActionOf<Sender> action;
    action.setReceiver(addTo, 5);
    action.invoke(&sender);
    action.invoke(&sender);
    EXPECT_EQ(sender.value, 10);
    action.setReceiver(nullptr);
    action.invoke(&sender);
    EXPECT_EQ(sender.value, 10);
}

TEST(Action, OwnsOneReferenceToItsContextAndPassesAFurtherOne) {
    Deaths deaths;
    Sender sender;
    {
        ActionOf<Sender> action;
        action.setReceiver(
            noteCount,
            Ref<PFRefCounted>(Returner<TrackedValue>(new TrackedValue("context", &deaths))));
        action.invoke(&sender);
        EXPECT_EQ(sender.value, 2);
        EXPECT_TRUE(deaths.empty());
    }
    EXPECT_EQ(deaths, Deaths({"context"}));
}

TEST(Action, WithoutAReceiverItOpensNoPool) {
    // While another thread has a pool, this one could not open any: the call would not return.
    std::promise<void> opened;
    std::promise<void> done;
    std::thread other([&] {
        AutoreleasePool pool;
        opened.set_value();
        done.get_future().wait();
    });
    opened.get_future().wait();
    Action action;
    action.invoke(nullptr);
    done.set_value();
    other.join();
}

TEST(Action, LetsNoExceptionOut) {
    LogCapture log;
    Target target;
    Sender sender;
    ActionOf<Sender> action;
    const unsigned hits = getExceptionHits();
    action.setReceiver(receiver(&target, &Target::fail));
    action.invoke(&sender);
    action.setReceiver(receiver(&target, &Target::failOddly));
    action.invoke(&sender);
    EXPECT_EQ(log.lines(),
              std::vector<std::string>({"[WARNING] std::runtime_error \"no good\" caught in void "
                                        "Orvane::Action::invoke(void *)",
                                        "[WARNING] Unknown exception caught in void "
                                        "Orvane::Action::invoke(void *)"}));
    EXPECT_EQ(getExceptionHits(), hits + 2);
}
