#pragma once

#include "Foundation/Logger.h"

#include <cstdlib>
#include <string_view>

// What the targets have in common.

/// Ends the program, which is what the fuzzer looks for, where something does not hold that must.
inline void require(bool condition) {
    if (!condition) std::abort();
}

/// Most inputs are nothing good, which is warned about. It is the log of the process while it
/// lives.
class NoLog : public Foundation::LogSink {
 public:
    NoLog() : mPrevious(Foundation::setLogSink(this)) {}
    ~NoLog() override { Foundation::setLogSink(mPrevious); }
    NoLog(const NoLog&) = delete;
    NoLog& operator=(const NoLog&) = delete;

    void write(const Foundation::Logger&, std::string_view) override {}

 private:
    Foundation::LogSink* mPrevious;
};
