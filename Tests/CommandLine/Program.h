#pragma once

#include "Support/ChildProcess.h"

#include <string>
#include <utility>
#include <vector>

/// Runs the program itself with arguments.
inline Support::ChildResult runOrvane(std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), ORVANE_PROGRAM);
    return Support::runChild(arguments);
}

/// Runs a line of the shell, in which "$0" is the program and "$1" and so on the arguments.
inline Support::ChildResult runInShell(const std::string& line,
                                       const std::vector<std::string>& arguments = {}) {
    std::vector<std::string> command{"/bin/sh", "-c", line, ORVANE_PROGRAM};
    command.insert(command.end(), arguments.begin(), arguments.end());
    return Support::runChild(command);
}
