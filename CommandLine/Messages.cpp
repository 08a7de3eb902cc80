#include "Messages.h"

#include <cstdio>

namespace Commands {

void Messages::say(const std::string& line) {
    std::fputs((line + '\n').c_str(), stderr);
}

void Messages::complain(const std::string& verb, const std::string& line) {
    say("orvane" + (verb.empty() ? "" : ' ' + verb) + ": " + line);
}

std::string counted(std::size_t number, const std::string& one, const std::string& many) {
    return std::to_string(number) + ' ' + (number == 1 ? one : many);
}

}  // namespace Commands
