// The agent that is killed while it refreshes, for the test of what the files then are:
//
//   refresh_worker BASE    works on a storage as the agent does, without a message bus and without
//                          the wait at the start. Writes "started", and "ended URL" when the
//                          refresh of a feed has ended well, "failed URL" when it has not.

#include "Agent/AgentPorts.h"
#include "Agent/AgentTask.h"
#include "Foundation/Clock.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/RunLoop.h"
#include "Foundation/URL.h"
#include "Model/FeedCore.h"
#include "SQLite/FakeCenter.h"
#include "Support/LogCapture.h"
#include "Utilities/FileSystem.h"

#include <unistd.h>

#include <cstdio>
#include <exception>
#include <string>

using namespace Foundation;
using namespace Orvane;

namespace {

void say(const std::string& line) {
    const std::string text = line + "\n";
    if (write(STDOUT_FILENO, text.data(), text.size()) != static_cast<ssize_t>(text.size())) {
        _exit(3);  // nobody listens any more
    }
}

/// The machine's time, and from some moment on a later one.
class HurryingClock : public Clock {
 public:
    HurryingClock() : mMachine(Clock::current()) { setCurrent(this); }
    ~HurryingClock() override { setCurrent(nullptr); }

    double now() const override { return mMachine.now() + mAhead; }
    void sleep(double seconds) override { mMachine.sleep(seconds); }
    bool runsByItself() const override { return true; }
    bool advanceIdle(double) override { return false; }
    void skip(double seconds) { mAhead += seconds; }

 private:
    Clock& mMachine;
    double mAhead = 0;
};

class Acknowledgements {
 public:
    Acknowledgements() : mReceiver(this, &Acknowledgements::ended) {
        NotificationCenter::getLocal()->addObserver(
            &mReceiver, FeedCore::kEndedUpdateLocalNotification, nullptr);
    }
    ~Acknowledgements() { NotificationCenter::getLocal()->removeObserver(&mReceiver); }
    Acknowledgements(const Acknowledgements&) = delete;
    Acknowledgements& operator=(const Acknowledgements&) = delete;

 private:
    void ended(Notification* notification) {
        const auto* feed = notification->getObject<FeedCore>();
        const char* const end = feed->getLastError().code == 0 ? "ended " : "failed ";
        say(end + feed->mURL.getValue()->text());
    }

    MethodReceiver<Notification, Acknowledgements> mReceiver;
};

void work(const char* base) {
    const AutoreleasePool pool;
    const Ref<URL> url{URL::urlWithFileSystemPath(base, true)};
    Compatibility::FileSystem::setStorageBaseURL(url);
    HurryingClock clock;
    const AgentPorts ports;
    AgentTask task;
    const Acknowledgements acknowledgements;
    {
        const AutoreleasePool inner;
        task.start(false);
        clock.skip(AgentTask::kHoldOffSeconds);
        say("started");
        task.scheduleNextRefresh();
    }
    RunLoop::current().run();
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 2) return 2;
    FakeCenter noBus;
    const Support::LogCapture quiet;
    try {
        work(argv[1]);
    } catch (const std::exception& exception) {
        std::fprintf(stderr, "refresh_worker: %s\n", exception.what());
    }
    return 1;
}
