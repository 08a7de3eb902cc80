#pragma once

#include "VerbSpec.h"

#include <string>
#include <vector>

/// Scripts that complete the words of the command line, made from the tables of all verbs. Feeds
/// and entries they ask the program for, unless there is no database yet.
namespace Commands::Completion {

std::string bash(const std::vector<const VerbSpec*>& verbs);
std::string zsh(const std::vector<const VerbSpec*>& verbs);
std::string fish(const std::vector<const VerbSpec*>& verbs);

}  // namespace Commands::Completion
