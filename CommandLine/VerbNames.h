#pragma once

#include "VerbSpec.h"

#include <string>
#include <vector>

namespace Commands::VerbNames {

/// The table of a verb. Throws `Failure` with `ExitStatus::Usage` if there is none of that name,
/// and says which was probably meant.
const VerbSpec& find(const std::string& name, const std::vector<const VerbSpec*>& verbs);

}  // namespace Commands::VerbNames
