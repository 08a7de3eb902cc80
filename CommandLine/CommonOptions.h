#pragma once

#include "VerbSpec.h"

#include <vector>

namespace Commands::CommonOptions {

/// One list out of several.
std::vector<OptionSpec> join(std::vector<std::vector<OptionSpec>> lists);

/// "--json" and "--jsonl".
std::vector<OptionSpec> output();
/// "--client".
std::vector<OptionSpec> client();
/// "--dry-run".
std::vector<OptionSpec> dryRun();

}  // namespace Commands::CommonOptions
