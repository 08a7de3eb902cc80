#pragma once

#include "Foundation/Logger.h"

#include <string>
#include <vector>

namespace Support {

/// Takes the log's lines while it lives, so that a test can look at them; prints nothing.
class LogCapture : public Foundation::LogSink {
 public:
    LogCapture();
    ~LogCapture() override;

    void write(const Foundation::Logger& logger, std::string_view text) override;

    /// The lines as "[facility] text", the general log's as "text".
    const std::vector<std::string>& lines() const { return mLines; }
    /// How many lines contain `text`.
    int count(std::string_view text) const;
    bool contains(std::string_view text) const { return count(text) > 0; }
    void clear() { mLines.clear(); }

 private:
    Foundation::LogSink* mPrevious;
    std::vector<std::string> mLines;
};

/// Turns facilities on, with the general log, and off again at the end.
class LoggingOn {
 public:
    explicit LoggingOn(std::vector<Foundation::Logger*> loggers);
    ~LoggingOn();
    LoggingOn(const LoggingOn&) = delete;
    LoggingOn& operator=(const LoggingOn&) = delete;

 private:
    std::vector<Foundation::Logger*> mLoggers;
};

}  // namespace Support
