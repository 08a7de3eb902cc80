#include "Support/TurnUntil.h"

#include "Foundation/RunLoop.h"

#include <glib.h>

#include <chrono>

namespace Support {

bool turnUntil(const std::function<bool()>& condition, double seconds) {
    using Clock = std::chrono::steady_clock;
    const auto end = Clock::now() + std::chrono::duration<double>(seconds);
    Foundation::RunLoop::current();  // its timers and sources are in the context
    GMainContext* context = g_main_context_ref_thread_default();
    // Wakes the wait: not all that a condition looks at tells the loop of its changes.
    GSource* tick = g_timeout_source_new(5);
    g_source_set_callback(
        tick, [](gpointer) -> gboolean { return G_SOURCE_CONTINUE; }, nullptr, nullptr);
    g_source_attach(tick, context);
    bool holds = condition();
    while (!holds && Clock::now() < end) {
        g_main_context_iteration(context, TRUE);
        holds = condition();
    }
    g_source_destroy(tick);
    g_source_unref(tick);
    g_main_context_unref(context);
    return holds;
}

}  // namespace Support
