// The agent of a life: the library's own, by the world's time, and with the test for its service
// manager. It tells the test of what it does, as lines "WORD TIME [TEXT]":
//
//   started TIME          it begins
//   ended TIME URL        the refresh of a feed has ended
//   reached TIME          it has nothing to do before the time that the test has named last
//   rest TIME SECONDS     it is about to end, and wants to be started again after so long
//
// The test names times, as numbers, or says "wake" after a sleep of the machine, and "network" when
// there is one again. By itself no time passes.

#include "Agent/OVAgentFrameworkMain.h"
#include "Agent/ServiceManager.h"
#include "EndToEnd/World.h"
#include "Foundation/ApplicationIdentity.h"
#include "Foundation/Notification.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/NotificationNames.h"
#include "Foundation/RunLoop.h"
#include "Foundation/URL.h"
#include "Model/FeedCore.h"
#include "Utilities/FileUtils.h"

#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <limits>
#include <memory>
#include <string>

using namespace Foundation;
using Orvane::FeedCore;

namespace {

/// The line to the test. Without it there is no time, and nothing to live for.
class Line {
 public:
    explicit Line(World& world) : mWorld(world), mFD(world.connect()) { say("started"); }

    void say(const std::string& word, const std::string& text = {}) {
        char time[64];
        std::snprintf(time, sizeof time, " %.17g ", mWorld.now());
        World::send(mFD.get(), word + time + text);
    }
    int getFD() const { return mFD.get(); }

 private:
    World& mWorld;
    const UniqueFD mFD;
};

/// Moves the world's time from timer to timer while the agent has nothing to do, as far as the test
/// lets it. While a feed is being refreshed, and files are being deleted, it stands still: what
/// that takes is the machine's time, in which nothing of the world may change.
class AgentClock : public WorldClock {
 public:
    AgentClock(World& world, Line& line)
        : WorldClock(world), mLine(line), mSource(line.getFD()), mTarget(world.now()) {
        mSource.setReadHandler([this] { takeTarget(); });
        mSource.addTo(RunLoop::current(), RunLoop::kCommonModes);
        NotificationCenter* const local = NotificationCenter::getLocal();
        local->addObserver(&mBegan, FeedCore::kWillRefreshNotification, nullptr);
        local->addObserver(&mEnded, FeedCore::kEndedUpdateLocalNotification, nullptr);
    }
    ~AgentClock() override {
        NotificationCenter::getLocal()->removeObserver(&mBegan);
        NotificationCenter::getLocal()->removeObserver(&mEnded);
    }

    bool advanceIdle(double next) override {
        if (mRefreshing > 0) return false;
        if (Orvane::FileUtils::isDeletingFilesAsynchronously()) {
            sleep(0);
            return true;
        }
        const double date = std::min(next, mTarget);
        if (date > now()) {
            mWorld.moveTo(date);
            return true;
        }
        if (mHasReached) return false;
        mHasReached = true;
        mLine.say("reached");
        return false;
    }

 private:
    void takeTarget() {
        const std::string message = World::receive(mLine.getFD());
        if (message.empty()) _exit(3);
        if (message == "wake") return post(NotificationNames::kDidWake);
        if (message == "network") return post(NotificationNames::kNetworkChanged);
        mTarget = std::strtod(message.c_str(), nullptr);
        mHasReached = false;
    }
    static void post(const NotificationName& name) {
        NotificationCenter::getLocal()->post(name.string(), nullptr, nullptr);
    }
    void refreshBegan(Notification*) { ++mRefreshing; }
    void refreshEnded(Notification* notification) {
        --mRefreshing;
        const auto* feed = notification->getObject<FeedCore>();
        mLine.say("ended", std::string(feed->mURL.getValue()->text()));
    }

    Line& mLine;
    FileDescriptorSource mSource;
    Orvane::MethodReceiver<Notification, AgentClock> mBegan{this, &AgentClock::refreshBegan};
    Orvane::MethodReceiver<Notification, AgentClock> mEnded{this, &AgentClock::refreshEnded};
    double mTarget;
    bool mHasReached = true;
    int mRefreshing = 0;
};

/// The test starts the agent when it wants to be started.
class TestServiceManager : public Orvane::ServiceManager {
 public:
    explicit TestServiceManager(Line& line) : mLine(line) { setCurrent(this); }
    ~TestServiceManager() override { setCurrent(nullptr); }

    bool isManaged() override { return false; }
    Reply checkIn() override { return {}; }
    int setStartInterval(std::int64_t seconds) override {
        mLine.say("rest", std::to_string(seconds));
        return 0;
    }

 private:
    Line& mLine;
};

int live() {
    // The first who looks at preferences needs a name.
    ApplicationIdentity::setIdentifier("com.tarnwick.Orvane.Agent");
    World world;
    Line line(world);
    AgentClock clock(world, line);
    TestServiceManager manager(line);
    return OVAgentFrameworkMain();
}

}  // namespace

int main() {
    try {
        return live();
    } catch (const std::exception& exception) {
        std::fprintf(stderr, "life_agent: %s\n", exception.what());
        return 1;
    }
}
