#include "Foundation/Logger.h"

#include "Foundation/PasswordMask.h"
#include "Foundation/Switches.h"
#include "Foundation/TypeName.h"
#include "Foundation/Uncopyable.h"
#include "Foundation/Utils.h"

#include <unistd.h>

#include <atomic>
#include <cstdio>
#include <cstring>
#include <string>

namespace Foundation {

namespace {

// Lines may come from the queue that deletes files, so what they count is atomic.
std::atomic<int> sInsideLogCall = 0;
std::atomic<unsigned> sExceptionHits = 0;
std::atomic<LogSink*> sSink = nullptr;

constexpr std::size_t kIndentationStep = 4;  ///< blanks

// Reading a preference may itself log, on a facility that is not settled yet. Until the reader is
// done such a facility is off, and stays unsettled.
thread_local bool sIsAskingPreferences = false;

class AskingPreferences : Uncopyable {
 public:
    AskingPreferences() { sIsAskingPreferences = true; }
    ~AskingPreferences() { sIsAskingPreferences = false; }
};

/// The preference "OVLog", read once for the process.
bool isLoggingOn() {
    static const bool sIsOn = GetBoolPref("OVLog", false);
    return sIsOn;
}

bool askWhetherOn(const char* name) {
    const AskingPreferences asking;
    if (!isLoggingOn()) return false;
    if (!name) return true;
    char key[100];
    std::snprintf(key, sizeof key, "OVLog%s", name);
    return GetBoolPref(key, false);
}

/// Off as well where the preferences cannot be asked: no line of the log may fail its caller.
bool isFacilityOn(const char* name) noexcept {
    try {
        return askWhetherOn(name);
    } catch (...) {
        return false;
    }
}

bool decideOnSystemLog() {
    char set[2];
    if (Compatibility::Utils::copyenv(set, sizeof set, "OVUseSystemLog")) {
        return GetBoolEnv("OVUseSystemLog");
    }
    return !isatty(STDERR_FILENO);
}

LogSink& currentSink() {
    if (LogSink* sink = sSink) return *sink;
    static const bool gUseSystemLog = decideOnSystemLog();
    return gUseSystemLog ? journalSink() : standardErrorSink();
}

}  // namespace

void Logger::_init() {
    if (mState < 0) return;
    if (mState < 2 && sIsAskingPreferences) return;
    mDisabled = mState < 2 && !isFacilityOn(mName);
    mAlways = mState > 1;
    mLineCount = 0;
    mState = -1;
}

void Logger::setEnabled(bool enabled) {
    _init();
    mDisabled = !enabled;
}

bool Logger::willLog() {
    _init();
    if (mDisabled || mState >= 0) return false;
    if (mAlways) return true;
    gLog._init();
    return !gLog.mDisabled;
}

void Logger::alwaysLogV(const char* format, std::span<const OVFormatArgument> arguments) noexcept {
    try {
        _init();
        const InsideLogCall inside;
        ++mLineCount;
        std::string line(mIndentation * kIndentationStep, ' ');
        line += OVFormatV(format, arguments);
        // Here, since URLs come into lines by many ways.
        maskPasswords(line);
        currentSink().write(*this, line);
    } catch (...) {
        // A line that cannot be written is lost: its caller must not fail for it.
        std::fputs("Orvane: a line of the log could not be written\n", stderr);
    }
}

LogSink* setLogSink(LogSink* sink) {
    return sSink.exchange(sink);
}

int insideLogCall() {
    return sInsideLogCall;
}

InsideLogCall::InsideLogCall() {
    ++sInsideLogCall;
}
InsideLogCall::~InsideLogCall() {
    --sInsideLogCall;
}

void doWarnAboutException(const std::exception* e, const char* where) noexcept {
    ++sExceptionHits;
    if (e) {
        gWarn.log("%s \"%s\" caught in %s", getTypeName(typeid(*e)), e->what(), where);
    } else {
        gWarn.log("Unknown exception caught in %s", where);
    }
}

void warnAboutCurrentException(const char* where) noexcept {
    try {
        throw;
    } catch (const std::exception& e) {
        doWarnAboutException(&e, where);
    } catch (...) {
        doWarnAboutException(nullptr, where);
    }
}

unsigned getExceptionHits() {
    return sExceptionHits;
}

}  // namespace Foundation
