#pragma once

#include "ExitStatus.h"
#include "Verb.h"

#include <memory>
#include <vector>

namespace Commands {

/// Finds out what the arguments ask for, and has it done.
class CommandLine {
 public:
    CommandLine();

    /// `arguments` as `main` has them. Says on standard error what is wrong with them, or what
    /// failed.
    ExitStatus run(int count, const char* const* arguments);

 private:
    std::vector<std::unique_ptr<Verb>> mVerbs;  ///< in the order of the help
};

}  // namespace Commands
