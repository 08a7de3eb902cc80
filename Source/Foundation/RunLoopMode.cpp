#include "Foundation/RunLoopMode.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Clock.h"

#include <sys/timerfd.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstring>
#include <ctime>
#include <limits>

namespace Foundation {

namespace {

constexpr double kNever = std::numeric_limits<double>::infinity();

std::timespec timespecOf(double date) {
    // What has passed is as good as 2001. Whole seconds are taken apart first, as the sum of the
    // date and the offset would lose its last bits.
    const double reached = std::fmax(date, 0);
    const double seconds = std::floor(reached);
    std::timespec t = {};
    t.tv_sec = static_cast<std::time_t>(seconds) + static_cast<std::time_t>(kUnixEpochOffset);
    // Rounded up: a timer that wakes a moment early would have to wait once more.
    t.tv_nsec = static_cast<long>(std::ceil((reached - seconds) * 1e9));
    if (t.tv_nsec > 999'999'999) {
        t.tv_nsec = 0;
        ++t.tv_sec;
    }
    return t;
}

}  // namespace

struct RunLoop::Mode::TimerGSource {
    GSource base;
    Mode* mode;
    gpointer fdTag;
};

struct RunLoop::Mode::SourceGSource {
    GSource base;
    Mode* mode;
    RunLoopSource* source;
    RunLoopSource::Interest interest;
    gpointer fdTag;
};

GSourceFuncs RunLoop::Mode::sTimerFunctions = {prepareTimers, checkTimers, dispatchTimers,
                                               nullptr,       nullptr,     nullptr};
GSourceFuncs RunLoop::Mode::sSourceFunctions = {prepareSource, checkSource, dispatchSource,
                                                nullptr,       nullptr,     nullptr};

RunLoop::Mode::Mode(RunLoop& loop, const std::string& name, GMainContext* context)
    : mLoop(loop),
      mName(name),
      mTimerFD(timerfd_create(CLOCK_REALTIME, TFD_NONBLOCK | TFD_CLOEXEC)),
      mArmedFor(kNever) {
    OV_ASSERT_MESSAGE(mTimerFD, "A run loop gets no timer: %s", std::strerror(errno));
    mContext = g_main_context_ref(context);
    mTimerSource = g_source_new(&sTimerFunctions, sizeof(TimerGSource));
    auto* timers = reinterpret_cast<TimerGSource*>(mTimerSource);
    timers->mode = this;
    timers->fdTag = g_source_add_unix_fd(mTimerSource, mTimerFD.get(), G_IO_IN);
    // A timer's callback may run the loop again, and other timers must fire in that run.
    g_source_set_can_recurse(mTimerSource, TRUE);
    g_source_set_name(mTimerSource, "Orvane timers");
    g_source_attach(mTimerSource, mContext);
}

RunLoop::Mode::~Mode() {
    while (!mSources.empty()) {
        detach(mSources.begin()->first);
    }
    g_source_destroy(mTimerSource);
    g_source_unref(mTimerSource);
    g_main_context_unref(mContext);
}

void RunLoop::Mode::attach(RunLoopSource* source) {
    GSource* gSource = g_source_new(&sSourceFunctions, sizeof(SourceGSource));
    auto* entry = reinterpret_cast<SourceGSource*>(gSource);
    entry->mode = this;
    entry->source = source;
    entry->interest = {};
    entry->fdTag = nullptr;
    g_source_set_can_recurse(gSource, source->isReentrant());
    g_source_set_name(gSource, "Orvane source");
    g_source_attach(gSource, mContext);
    mSources[source] = gSource;
}

void RunLoop::Mode::detach(RunLoopSource* source) {
    const auto found = mSources.find(source);
    if (found == mSources.end()) return;
    GSource* gSource = found->second;
    mSources.erase(found);
    reinterpret_cast<SourceGSource*>(gSource)->source = nullptr;
    g_source_destroy(gSource);
    g_source_unref(gSource);
}

void RunLoop::Mode::iterate(bool mayWait) {
    if (!Clock::current().runsByItself()) {
        if (serveReady() || Clock::current().advanceIdle(mLoop.getNextWakeDate(mName))) return;
    }
    g_main_context_iteration(mContext, mayWait);
}

bool RunLoop::Mode::serveReady() {
    return g_main_context_iteration(mContext, FALSE);
}

bool RunLoop::Mode::timersAreDue() const {
    return mLoop.getNextFireDate(mName) <= Clock::current().now();
}

void RunLoop::Mode::armTimer(double date) {
    if (date == mArmedFor) return;
    mArmedFor = date;
    itimerspec setting = {};
    constexpr double kFarAway = 1e12;  // beyond what the kernel's seconds are good for
    if (date < kFarAway) setting.it_value = timespecOf(date);
    timerfd_settime(mTimerFD.get(), TFD_TIMER_ABSTIME | TFD_TIMER_CANCEL_ON_SET, &setting, nullptr);
}

gboolean RunLoop::Mode::prepareTimers(GSource* source, gint* timeout) {
    Mode& mode = *reinterpret_cast<TimerGSource*>(source)->mode;
    *timeout = -1;
    if (mode.timersAreDue()) return TRUE;
    if (Clock::current().runsByItself()) mode.armTimer(mode.mLoop.getNextWakeDate(mode.mName));
    return FALSE;
}

gboolean RunLoop::Mode::checkTimers(GSource* source) {
    auto* entry = reinterpret_cast<TimerGSource*>(source);
    Mode& mode = *entry->mode;
    if (g_source_query_unix_fd(source, entry->fdTag)) {
        std::uint64_t expirations;
        // Fails with ECANCELED when the clock was set: then, too, the dates are looked at anew.
        [[maybe_unused]] const ssize_t ignored =
            read(mode.mTimerFD.get(), &expirations, sizeof expirations);
        mode.mArmedFor = kNever;
    }
    return mode.timersAreDue();
}

gboolean RunLoop::Mode::dispatchTimers(GSource* source, GSourceFunc, gpointer) {
    Mode& mode = *reinterpret_cast<TimerGSource*>(source)->mode;
    mode.mLoop.fireDueTimers(mode.mName);
    return G_SOURCE_CONTINUE;
}

void RunLoop::Mode::watch(SourceGSource* entry, const RunLoopSource::Interest& wanted) {
    GSource* source = &entry->base;
    const auto events = static_cast<GIOCondition>(wanted.events);
    if (wanted.fd != entry->interest.fd) {
        if (entry->fdTag) g_source_remove_unix_fd(source, entry->fdTag);
        entry->fdTag = wanted.fd < 0 ? nullptr : g_source_add_unix_fd(source, wanted.fd, events);
    } else if (entry->fdTag && wanted.events != entry->interest.events) {
        g_source_modify_unix_fd(source, entry->fdTag, events);
    }
    entry->interest = wanted;
}

gboolean RunLoop::Mode::prepareSource(GSource* source, gint* timeout) {
    auto* entry = reinterpret_cast<SourceGSource*>(source);
    // In another mode the source has an entry of its own, which GLib does not hold back.
    RunLoopSource* const runSource = entry->source;
    const bool isHeldBack = entry->mode->mLoop.isServing(runSource) && !runSource->isReentrant();
    watch(entry, isHeldBack ? RunLoopSource::Interest{} : runSource->interest());
    *timeout = -1;
    if (entry->interest.deadline >= 0) {
        const gint64 left = entry->interest.deadline - g_source_get_time(source);
        *timeout = static_cast<gint>(std::clamp<gint64>((left + 999) / 1000, 0, G_MAXINT));
    }
    return entry->interest.readyNow || *timeout == 0;
}

gboolean RunLoop::Mode::checkSource(GSource* source) {
    auto* entry = reinterpret_cast<SourceGSource*>(source);
    const gint64 deadline = entry->interest.deadline;
    if (entry->interest.readyNow) return TRUE;
    if (deadline >= 0 && g_source_get_time(source) >= deadline) return TRUE;
    return entry->fdTag && g_source_query_unix_fd(source, entry->fdTag) != 0;
}

gboolean RunLoop::Mode::dispatchSource(GSource* source, GSourceFunc, gpointer) {
    auto* entry = reinterpret_cast<SourceGSource*>(source);
    const GIOCondition events =
        entry->fdTag ? g_source_query_unix_fd(source, entry->fdTag) : GIOCondition{};
    entry->mode->mLoop.serve(entry->source, static_cast<short>(events));
    return G_SOURCE_CONTINUE;
}

}  // namespace Foundation
