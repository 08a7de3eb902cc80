#pragma once

#include "Foundation/RunLoop.h"
#include "Foundation/UniqueFD.h"

#include <glib.h>

#include <map>
#include <string>

namespace Foundation {

/// One mode of a loop: a GLib context with a source for the loop's timers and one for each
/// `RunLoopSource` that is served in it.
class RunLoop::Mode : Uncopyable {
 public:
    Mode(RunLoop& loop, const std::string& name, GMainContext* context);
    ~Mode();

    void attach(RunLoopSource* source);
    void detach(RunLoopSource* source);
    /// One turn, which waits for something to serve if it may.
    void iterate(bool mayWait);
    /// Serves what is ready now. Whether there was anything.
    bool serveReady();

 private:
    struct TimerGSource;
    struct SourceGSource;
    static GSourceFuncs sTimerFunctions;
    static GSourceFuncs sSourceFunctions;

    static gboolean prepareTimers(GSource* source, gint* timeout);
    static gboolean checkTimers(GSource* source);
    static gboolean dispatchTimers(GSource* source, GSourceFunc, gpointer);
    static void watch(SourceGSource* entry, const RunLoopSource::Interest& wanted);
    static gboolean prepareSource(GSource* source, gint* timeout);
    static gboolean checkSource(GSource* source);
    static gboolean dispatchSource(GSource* source, GSourceFunc, gpointer);

    bool timersAreDue() const;
    void armTimer(double date);

    RunLoop& mLoop;
    std::string mName;
    UniqueFD mTimerFD;  ///< an absolute wall-clock timer, so that a sleep or a set clock wakes us
    GMainContext* mContext = nullptr;
    GSource* mTimerSource = nullptr;
    double mArmedFor;
    std::map<RunLoopSource*, GSource*> mSources;
};

}  // namespace Foundation
