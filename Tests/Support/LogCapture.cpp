#include "Support/LogCapture.h"

#include <algorithm>

namespace Support {

LogCapture::LogCapture() : mPrevious(Foundation::setLogSink(this)) {}

LogCapture::~LogCapture() {
    Foundation::setLogSink(mPrevious);
}

void LogCapture::write(const Foundation::Logger& logger, std::string_view text) {
    std::string line = logger.mName ? "[" + std::string(logger.mName) + "] " : std::string();
    mLines.push_back(line.append(text));
}

int LogCapture::count(std::string_view text) const {
    return static_cast<int>(std::count_if(
        mLines.begin(), mLines.end(),
        [&](const std::string& line) { return line.find(text) != std::string::npos; }));
}

LoggingOn::LoggingOn(std::vector<Foundation::Logger*> loggers) : mLoggers(std::move(loggers)) {
    mLoggers.push_back(&Foundation::gLog);
    for (Foundation::Logger* logger : mLoggers) {
        logger->setEnabled(true);
    }
}

LoggingOn::~LoggingOn() {
    for (Foundation::Logger* logger : mLoggers) {
        logger->setEnabled(false);
    }
}

}  // namespace Support
