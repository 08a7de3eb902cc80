#include "Foundation/Clock.h"
#include "Foundation/Logger.h"

#define SD_JOURNAL_SUPPRESS_LOCATION
#include <systemd/sd-journal.h>
#include <unistd.h>

#include <cmath>
#include <cstdio>
#include <ctime>
#include <string>

namespace Foundation {

namespace {

constexpr long long kMicrosecondsPerSecond = 1000000;

std::string timestamp() {
    // A double holds the time to a fraction of a microsecond: below that it is noise, which would
    // now and then show a millisecond too few.
    const auto unixMicroseconds =
        std::llround((Clock::current().now() + kUnixEpochOffset) * kMicrosecondsPerSecond);
    const std::time_t seconds = unixMicroseconds / kMicrosecondsPerSecond;
    const auto milliseconds = unixMicroseconds % kMicrosecondsPerSecond / 1000;
    std::tm local = {};
    localtime_r(&seconds, &local);
    return OVFormat("%02d/%02d/%02d %02d:%02d:%02d.%03d", local.tm_mon + 1, local.tm_mday,
                    local.tm_year % 100, local.tm_hour, local.tm_min, local.tm_sec, milliseconds);
}

class StandardErrorSink : public LogSink {
 public:
    void write(const Logger& logger, std::string_view text) override {
        std::string line = OVFormat("%s: %u ", timestamp(), static_cast<unsigned>(getpid()));
        if (logger.mName) line += OVFormat("[%s] ", logger.mName);
        line += text;
        line += '\n';
        std::fwrite(line.data(), 1, line.size(), stderr);
        std::fflush(stderr);
    }
};

class JournalSink : public LogSink {
 public:
    void write(const Logger& logger, std::string_view text) override {
        // The library takes a journal that is not there for a success. Where there is none, the
        // session keeps what its programs write to standard error.
        const bool isThere = access(kSocketPath, F_OK) == 0;
        if (!isThere || send(logger, text) < 0) standardErrorSink().write(logger, text);
    }

 private:
    static constexpr const char* kSocketPath = "/run/systemd/journal/socket";
    static constexpr int kUserFacility = 1;  ///< "user-level messages" of RFC 5424
    static constexpr int kWarning = 4;
    static constexpr int kNotice = 5;

    static int send(const Logger& logger, std::string_view text) {
        const std::string facility =
            logger.mName ? OVFormat("Orvane-%s", logger.mName) : std::string("Orvane");
        return sd_journal_send("MESSAGE=%.*s", static_cast<int>(text.size()), text.data(),
                               "PRIORITY=%i", &logger == &gWarn ? kWarning : kNotice,
                               "SYSLOG_IDENTIFIER=orvane", "SYSLOG_FACILITY=%i", kUserFacility,
                               "ORVANE_FACILITY=%s", facility.c_str(), nullptr);
    }
};

}  // namespace

LogSink& standardErrorSink() {
    // Neither sink is ever destroyed, as what ends with the process may still log.
    static auto* const sSink = new StandardErrorSink;
    return *sSink;
}

LogSink& journalSink() {
    static auto* const sSink = new JournalSink;
    return *sSink;
}

}  // namespace Foundation
