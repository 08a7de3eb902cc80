#include "EventLoop.h"

#include <glib-unix.h>

#include <chrono>
#include <csignal>

namespace Commands {

namespace {

constexpr unsigned kTickMilliseconds = 100;

bool sIsInterrupted = false;

gboolean interrupted(gpointer) {
    sIsInterrupted = true;
    return G_SOURCE_CONTINUE;
}

gboolean ticked(gpointer) {
    return G_SOURCE_CONTINUE;
}

void watchSignals() {
    static const bool sIsWatching = [] {
        g_unix_signal_add(SIGINT, interrupted, nullptr);
        g_unix_signal_add(SIGTERM, interrupted, nullptr);
        return true;
    }();
    static_cast<void>(sIsWatching);
}

}  // namespace

bool EventLoop::turnUntil(const std::function<bool()>& isDone, double seconds) {
    using Clock = std::chrono::steady_clock;
    watchSignals();
    const auto end = Clock::now() + std::chrono::duration<double>(seconds);
    const guint tick = g_timeout_add(kTickMilliseconds, ticked, nullptr);
    bool done = isDone();
    while (!done && !sIsInterrupted && (seconds < 0 || Clock::now() < end)) {
        g_main_context_iteration(nullptr, TRUE);
        done = isDone();
    }
    g_source_remove(tick);
    return done;
}

bool EventLoop::isInterrupted() {
    return sIsInterrupted;
}

}  // namespace Commands
