#pragma once

#include "Foundation/UniqueFD.h"

#include <sys/types.h>

#include <string>
#include <vector>

namespace Support {

/// A program that runs beside the test, which talks with it line by line over pipes. It is killed
/// at the end if it is still there.
class PipedChild {
 public:
    /// Starts it with this process's environment. Its standard error is the test's.
    explicit PipedChild(const std::vector<std::string>& command);
    ~PipedChild();
    PipedChild(const PipedChild&) = delete;
    PipedChild& operator=(const PipedChild&) = delete;

    /// Waits for the next line that it writes, and gives it without its end. Empty when it has
    /// closed its output, and when it is silent for two minutes.
    std::string readLine();
    /// Writes a line to its input. REQUIRES: SIGPIPE is ignored, for it may have ended.
    void writeLine(const std::string& line);
    /// Ends its input.
    void closeInput();
    /// Ends it with SIGKILL. What it has written can still be read.
    void kill();
    /// Waits for its end. Gives its exit status; -1 if a signal ended it.
    int wait();

 private:
    Foundation::UniqueFD mInput;   ///< what the child reads
    Foundation::UniqueFD mOutput;  ///< what it writes
    pid_t mPID = -1;
};

}  // namespace Support
