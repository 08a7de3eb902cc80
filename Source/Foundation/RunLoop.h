#pragma once

#include "Foundation/Ref.h"
#include "Foundation/RunLoopSource.h"
#include "Foundation/RunLoopTimer.h"
#include "Foundation/Uncopyable.h"

#include <functional>
#include <map>
#include <memory>
#include <set>
#include <string>
#include <vector>

typedef struct _GMainContext GMainContext;

namespace Foundation {

/// A thread's event loop: a thin skin over GLib's main context.
///
/// The default mode is the context that the application turns already (the thread-default one), so
/// a program on GTK or Qt serves our timers and sources with the loop it has. Any other mode is a
/// context of its own, which only the sources and timers of that mode join: a blocking run in such
/// a mode turns nothing else. What is added to the common modes is served in every mode.
///
/// All operations but `wakeUp` and `perform` belong to the loop's thread.
class RunLoop : Uncopyable {
 public:
    static constexpr const char* kDefaultMode = "default";
    static constexpr const char* kCommonModes = "common";

    enum class Result { Stopped, TimedOut, HandledSource };

    /// The loop of the calling thread, made on first use. On the main thread it stands on the
    /// thread-default context; another thread without one gets a context of its own.
    static RunLoop& current();
    ~RunLoop();

    /// Whether the calling thread is inside a callback of a main context of GLib, of whosever.
    static bool isInsideCallback();

    /// Turns the default mode until `stop`.
    void run();
    /// Turns `mode` until `stop`, until `seconds` have passed on the clock of the process
    /// (infinity for no limit; 0 serves what is ready and returns) or, if
    /// `returnAfterSourceHandled`, until a source, not a timer, has been served. Runs may nest.
    Result runInMode(const std::string& mode, double seconds, bool returnAfterSourceHandled);
    /// Ends the innermost run at the end of its turn; does nothing outside of a run.
    void stop();
    /// Serves everything that is ready now, without waiting. Whether there was anything.
    bool turn(const std::string& mode = kDefaultMode);

    /// Makes a waiting run look again. Any thread.
    void wakeUp();
    /// Calls `function` in a later turn of this loop, in any mode, in the order of the calls. A run
    /// inside such a function serves those behind it. Any thread.
    void perform(std::function<void()> function);

    /// Serves the timer in `mode`, or in all modes. REQUIRES: the timer is valid, in no loop.
    void addTimer(RunLoopTimer* timer, const std::string& mode);
    /// The date of the next timer of a mode or of the common ones; infinity if there is none.
    double getNextFireDate(const std::string& mode = kDefaultMode);

 private:
    friend class RunLoopSource;
    friend class RunLoopTimer;
    class Mode;
    class PerformSource;
    static bool isBefore(const RunLoopTimer* a, const RunLoopTimer* b);
    struct ByDate {
        bool operator()(const Ref<RunLoopTimer>& a, const Ref<RunLoopTimer>& b) const;
    };
    /// A run that has begun and not returned.
    struct Run {
        double deadline;
        int depth;  ///< of GLib's dispatches around the run
        bool stopped = false;
        bool handledSource = false;
    };
    struct Loops;
    using Timers = std::set<Ref<RunLoopTimer>, ByDate>;

    explicit RunLoop(GMainContext* defaultContext);

    Mode& modeNamed(const std::string& name);
    void addSource(RunLoopSource* source);
    void serve(RunLoopSource* source, short events);
    bool isServing(const RunLoopSource* source) const;
    void removeSource(RunLoopSource* source);
    void removeTimer(RunLoopTimer* timer);

    /// The next date at which a waiting run must look: a timer's, or the run's own deadline.
    double getNextWakeDate(const std::string& mode);
    void fireDueTimers(const std::string& mode);
    RunLoopTimer* nextDue(const std::string& mode, double now, std::uint64_t end);
    void fire(RunLoopTimer* timer, double now);

    std::map<std::string, std::unique_ptr<Mode>> mModes;
    std::map<std::string, Timers> mTimers;  ///< by mode, the common ones under their own name
    std::map<const RunLoopTimer*, std::string> mModeOfTimer;
    std::set<RunLoopSource*> mSources;
    std::unique_ptr<PerformSource> mPerform;
    std::vector<Run> mRuns;                      ///< the nested runs, innermost last
    std::vector<const RunLoopSource*> mServing;  ///< those in their `ready`, innermost last
    std::uint64_t mNextSequence = 1;
};

}  // namespace Foundation
