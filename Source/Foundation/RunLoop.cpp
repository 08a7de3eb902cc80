#include "Foundation/RunLoop.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Clock.h"
#include "Foundation/Guard.h"
#include "Foundation/RunLoopMode.h"
#include "Foundation/RunLoopPerformSource.h"

#include <sys/syscall.h>
#include <unistd.h>

#include <algorithm>
#include <limits>
#include <utility>

namespace Foundation {

namespace {

constexpr double kNever = std::numeric_limits<double>::infinity();

bool isMainThread() {
    return syscall(SYS_gettid) == getpid();
}

/// The context that stands for the calling thread's default mode. The caller gets a reference.
GMainContext* contextOfThread() {
    if (GMainContext* pushed = g_main_context_get_thread_default()) {
        return g_main_context_ref(pushed);
    }
    return isMainThread() ? g_main_context_ref(g_main_context_default()) : g_main_context_new();
}

}  // namespace

bool RunLoop::isBefore(const RunLoopTimer* a, const RunLoopTimer* b) {
    if (a->mFireDate != b->mFireDate) return a->mFireDate < b->mFireDate;
    return a->mSequence < b->mSequence;
}

bool RunLoop::ByDate::operator()(const Ref<RunLoopTimer>& a, const Ref<RunLoopTimer>& b) const {
    return isBefore(a, b);
}

/// The loops of one thread: one per context, as an application may push another default for a
/// while.
struct RunLoop::Loops {
    std::map<GMainContext*, std::unique_ptr<RunLoop>> byContext;
    RunLoop* own = nullptr;  ///< where no default is pushed

    RunLoop& current() {
        GMainContext* pushed = g_main_context_get_thread_default();
        if (!pushed && own) return *own;
        GMainContext* context = contextOfThread();
        std::unique_ptr<RunLoop>& loop = byContext[context];
        if (!loop) loop.reset(new RunLoop(context));
        if (!pushed) own = loop.get();
        g_main_context_unref(context);
        return *loop;
    }
};

bool RunLoop::isInsideCallback() {
    return g_main_depth() > 0;
}

RunLoop& RunLoop::current() {
    // The main thread's loops are never destroyed: objects that end with the process use them.
    static Loops* const sOfMainThread = new Loops;
    if (isMainThread()) return sOfMainThread->current();
    static thread_local Loops sOfThread;
    return sOfThread.current();
}

RunLoop::RunLoop(GMainContext* defaultContext) {
    mModes[kDefaultMode] = std::make_unique<Mode>(*this, kDefaultMode, defaultContext);
    mPerform = std::make_unique<PerformSource>();
    mPerform->addTo(*this, kCommonModes);
}

RunLoop::~RunLoop() {
    while (!mSources.empty()) {
        (*mSources.begin())->removeFromLoop();
    }
    while (!mModeOfTimer.empty()) {
        const_cast<RunLoopTimer*>(mModeOfTimer.begin()->first)->invalidate();
    }
}

void RunLoop::run() {
    runInMode(kDefaultMode, kNever, false);
}

RunLoop::Result RunLoop::runInMode(const std::string& name, double seconds,
                                   bool returnAfterSourceHandled) {
    Mode& mode = modeNamed(name);
    const double deadline = Clock::current().now() + seconds;
    const std::size_t depth = mRuns.size();
    mRuns.push_back({.deadline = deadline, .depth = g_main_depth()});
    bool mayWait = true;
    // The run's entry is looked up each time: nested runs may move it.
    while (mayWait && !mRuns[depth].stopped &&
           !(returnAfterSourceHandled && mRuns[depth].handledSource)) {
        mayWait = deadline > Clock::current().now();
        mode.iterate(mayWait);
    }
    const Run run = mRuns.back();
    mRuns.pop_back();
    if (run.stopped) return Result::Stopped;
    return returnAfterSourceHandled && run.handledSource ? Result::HandledSource : Result::TimedOut;
}

void RunLoop::stop() {
    if (!mRuns.empty()) mRuns.back().stopped = true;
}

bool RunLoop::turn(const std::string& mode) {
    bool any = false;
    while (modeNamed(mode).serveReady()) {
        any = true;
    }
    return any;
}

void RunLoop::serve(RunLoopSource* source, short events) {
    const bool isInternal = source == mPerform.get();
    if (!isInternal && !mRuns.empty()) mRuns.back().handledSource = true;
    mServing.push_back(source);
    callGuarded("void Foundation::RunLoopSource::ready(short)", [&] { source->ready(events); });
    mServing.pop_back();
}

bool RunLoop::isServing(const RunLoopSource* source) const {
    return std::find(mServing.begin(), mServing.end(), source) != mServing.end();
}

void RunLoop::wakeUp() {
    mPerform->wakeUp();
}

void RunLoop::perform(std::function<void()> function) {
    mPerform->perform(std::move(function));
}

RunLoop::Mode& RunLoop::modeNamed(const std::string& name) {
    const auto found = mModes.find(name);
    if (found != mModes.end()) return *found->second;
    OV_ASSERT(name != kCommonModes);
    const std::unique_ptr<GMainContext, void (*)(GMainContext*)> context(g_main_context_new(),
                                                                         g_main_context_unref);
    Mode& mode = *(mModes[name] = std::make_unique<Mode>(*this, name, context.get()));
    for (RunLoopSource* source : mSources) {
        if (source->mMode == kCommonModes) mode.attach(source);
    }
    return mode;
}

void RunLoop::addSource(RunLoopSource* source) {
    mSources.insert(source);
    if (source->mMode == kCommonModes) {
        for (auto& [name, mode] : mModes) {
            mode->attach(source);
        }
    } else {
        modeNamed(source->mMode).attach(source);
    }
}

void RunLoop::removeSource(RunLoopSource* source) {
    mSources.erase(source);
    // Another source may come to stand at its address.
    std::replace(mServing.begin(), mServing.end(), static_cast<const RunLoopSource*>(source),
                 static_cast<const RunLoopSource*>(nullptr));
    for (auto& [name, mode] : mModes) {
        mode->detach(source);
    }
}

void RunLoop::addTimer(RunLoopTimer* timer, const std::string& mode) {
    timer->mLoop = this;
    timer->mSequence = mNextSequence++;
    mModeOfTimer[timer] = mode;
    mTimers[mode].insert(Ref<RunLoopTimer>(timer));
}

void RunLoop::removeTimer(RunLoopTimer* timer) {
    const auto found = mModeOfTimer.find(timer);
    if (found == mModeOfTimer.end()) return;
    timer->mLoop = nullptr;
    const std::string mode = found->second;
    mModeOfTimer.erase(found);
    const Ref<RunLoopTimer> keep(timer);
    mTimers[mode].erase(keep);
}

double RunLoop::getNextFireDate(const std::string& mode) {
    double next = kNever;
    for (const Timers* timers : {&mTimers[mode], &mTimers[kCommonModes]}) {
        for (const Ref<RunLoopTimer>& timer : *timers) {
            if (timer->mIsFiring) continue;
            next = std::min(next, timer->mFireDate);
            break;
        }
    }
    return next;
}

double RunLoop::getNextWakeDate(const std::string& mode) {
    const double next = getNextFireDate(mode);
    // A loop of somebody else's inside a callback of the run must not wake for the deadline: it
    // cannot end the run, and would wake for ever once the deadline has passed.
    const bool isOwnTurn = !mRuns.empty() && mRuns.back().depth == g_main_depth();
    return isOwnTurn ? std::min(next, mRuns.back().deadline) : next;
}

void RunLoop::fireDueTimers(const std::string& mode) {
    const double now = Clock::current().now();
    // What is armed from here on, by the timers themselves, waits for the next turn.
    const std::uint64_t end = mNextSequence;
    while (RunLoopTimer* timer = nextDue(mode, now, end)) {
        fire(timer, now);
    }
}

RunLoopTimer* RunLoop::nextDue(const std::string& mode, double now, std::uint64_t end) {
    RunLoopTimer* first = nullptr;
    for (const Timers* timers : {&mTimers[mode], &mTimers[kCommonModes]}) {
        for (const Ref<RunLoopTimer>& timer : *timers) {
            if (timer->mFireDate > now) break;
            if (timer->mIsFiring || timer->mSequence >= end) continue;
            if (!first || isBefore(timer, first)) first = timer.get();
            break;
        }
    }
    return first;
}

void RunLoop::fire(RunLoopTimer* timer, double now) {
    const Ref<RunLoopTimer> keep(timer);
    const std::string mode = mModeOfTimer[timer];
    removeTimer(timer);
    timer->moveOn(now);
    if (timer->isValid()) addTimer(timer, mode);
    timer->mIsFiring = true;
    callGuarded("void Foundation::RunLoop::fire(RunLoopTimer *, double)",
                [&] { timer->mCallback(); });
    timer->mIsFiring = false;
}

}  // namespace Foundation
