#pragma once

#include <string>

namespace Commands {

/// Words for the user, on standard error.
struct Messages {
    /// A line as it is.
    static void say(const std::string& line);
    /// "orvane VERB: line".
    static void complain(const std::string& verb, const std::string& line);
};

/// "1 entry", "5 entries".
std::string counted(std::size_t number, const std::string& one, const std::string& many);

}  // namespace Commands
