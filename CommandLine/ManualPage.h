#pragma once

#include "VerbSpec.h"

#include <string>
#include <vector>

/// Manual pages in mdoc(7), made from the tables of the verbs.
namespace Commands::ManualPage {

/// orvane(1)
std::string program(const std::vector<const VerbSpec*>& verbs);
/// orvane-VERB(1)
std::string verb(const VerbSpec& verb);

}  // namespace Commands::ManualPage
