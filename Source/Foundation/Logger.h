#pragma once

#include <Orvane/OVFormat.h>

#include <cstdint>
#include <exception>
#include <span>
#include <string_view>

namespace Foundation {

/// One facility of the log: a plain structure, one global for each, declared in `Facilities.h`.
///
/// A facility is off until the preference or environment variable "OVLog" is on, and then, if it
/// has a name, until "OVLog" with the name appended is on as well ("OVLogSQL"). The warning log is
/// always on. Lines go to standard error if that is a terminal, otherwise to the journal;
/// the environment variable `OVUseSystemLog` decides where it is set.
///
/// A log call never fails and never throws. No line shows the password of a URL.
struct Logger {
    const char* mName = nullptr;  ///< null for the general log
    /// Before the first use the default mode, of which 2 and above always logs; then -1.
    std::int32_t mState = 0;
    bool mDisabled = false;
    bool mAlways = false;
    std::uint32_t mLineCount = 0;    ///< lines written
    std::uint32_t mIndentation = 0;  ///< how many steps its lines are moved in

    /// Settles whether the facility logs. Every other operation calls it.
    void _init();
    /// Turns the facility on or off, whatever the preferences say.
    void setEnabled(bool enabled);
    /// Whether a line would be written.
    bool willLog();

    /// Writes a line if `willLog()`.
    template <class... Args>
    void log(OVFormatString<Args...> format, const Args&... arguments) {
        if (!willLog()) return;
        OVWithFormatArguments(
            [&](std::span<const OVFormatArgument> list) { alwaysLogV(format.text(), list); },
            arguments...);
    }

    /// Moves the lines to come in by one step, or back out again; not beyond the margin.
    void indent() { ++mIndentation; }
    void outdent() {
        if (mIndentation > 0) --mIndentation;
    }
    void resetIndentation() { mIndentation = 0; }

    /// Writes a line.
    void alwaysLogV(const char* format, std::span<const OVFormatArgument> arguments) noexcept;
};

/// Where lines of the log go.
class LogSink {
 public:
    virtual ~LogSink() = default;
    /// Writes one line. `text` has no line end.
    virtual void write(const Logger& logger, std::string_view text) = 0;
};

/// Lines for people: "MM/dd/yy HH:mm:ss.SSS: pid [name] text" on standard error.
LogSink& standardErrorSink();
/// The journal: the facility "Orvane" or "Orvane-name", priority 4 for warnings and 5 for others.
LogSink& journalSink();
/// Replaces the sink of the process, and gives the one that was set before. Null, the default,
/// chooses between the two above. The sink must outlive its use.
LogSink* setLogSink(LogSink* sink);

/// How deep the process is inside log calls.
int insideLogCall();
/// Counts as a log call while it lives.
class InsideLogCall {
 public:
    InsideLogCall();
    ~InsideLogCall();
};

/// Reports an exception that goes no further: `where` is the signature of the function that
/// stopped it, `e` null for an exception that is no `std::exception`.
void doWarnAboutException(const std::exception* e, const char* where) noexcept;
/// The same for the exception in flight. REQUIRES: called from a catch handler.
void warnAboutCurrentException(const char* where) noexcept;
/// How many exceptions have been reported in this process.
unsigned getExceptionHits();

}  // namespace Foundation

#include "Foundation/Facilities.h"
#include "Foundation/FormatObjects.h"
