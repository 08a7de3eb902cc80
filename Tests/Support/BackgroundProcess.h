#pragma once

#include <sys/types.h>

#include <string>
#include <vector>

namespace Support {

/// A program that runs while this lives, or until it ends by itself. It reads nothing; its output
/// is that of the test. It does not outlive the test program.
class BackgroundProcess {
 public:
    /// Starts the program, found by the PATH, with its arguments.
    explicit BackgroundProcess(const std::vector<std::string>& command);
    /// Ends it, and waits until it has: after a minute by force.
    ~BackgroundProcess();
    BackgroundProcess(const BackgroundProcess&) = delete;
    BackgroundProcess& operator=(const BackgroundProcess&) = delete;

    pid_t getPID() const { return mPID; }

 private:
    bool endsInTime() const;

    pid_t mPID;
};

}  // namespace Support
