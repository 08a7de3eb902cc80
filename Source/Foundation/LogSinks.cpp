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

std::string timestamp() {
    const double now = Clock::current().now();
    const double whole = std::floor(now);
    const std::time_t seconds = static_cast<std::time_t>(whole + kUnixEpochOffset);
    std::tm local = {};
    localtime_r(&seconds, &local);
    return OVFormat("%02d/%02d/%02d %02d:%02d:%02d.%03d", local.tm_mon + 1, local.tm_mday,
                    local.tm_year % 100, local.tm_hour, local.tm_min, local.tm_sec,
                    static_cast<int>((now - whole) * 1000));
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
        const std::string facility =
            logger.mName ? OVFormat("Orvane-%s", logger.mName) : std::string("Orvane");
        constexpr int kUserFacility = 1;  // "user-level messages" of RFC 5424
        sd_journal_send("MESSAGE=%.*s", static_cast<int>(text.size()), text.data(), "PRIORITY=%i",
                        &logger == &gWarn ? 4 : 5, "SYSLOG_IDENTIFIER=orvane", "SYSLOG_FACILITY=%i",
                        kUserFacility, "ORVANE_FACILITY=%s", facility.c_str(), nullptr);
    }
};

}  // namespace

LogSink& standardErrorSink() {
    static StandardErrorSink sSink;
    return sSink;
}

LogSink& journalSink() {
    static JournalSink sSink;
    return sSink;
}

}  // namespace Foundation
