#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace Support {

/// What a program left behind.
struct ChildResult {
    int status = -1;  ///< its exit status; -1 if a signal ended it
    int pid = 0;
    std::string out;
    std::string err;
    double processorSeconds = 0;  ///< its own, and of its children that it has waited for
    std::size_t peakBytes = 0;    ///< of memory that it had at once; at least what the test had
};

/// What a program finds as its standard error.
enum class ChildStderr { File, Terminal };

/// Runs a program with this process's environment and waits for its end. What it writes to a
/// terminal must fit the terminal's buffer of 4 KB.
ChildResult runChild(const std::vector<std::string>& command, ChildStderr kind = ChildStderr::File);

}  // namespace Support
