#pragma once

#include "Failure.h"

#include <Orvane/OVError.h>

#include <optional>
#include <string>

namespace Commands::Trouble {

/// What an error of the library means for the end of the program.
ExitStatus statusOf(const OVError& error);

/// What happened and what can be done about it, on one line.
std::string textOf(const OVError& error);

/// Why nothing can be read from the database, as far as can be found out, with the cure. `error` is
/// what the library said.
Failure ofOpening(const std::optional<OVError>& error);

/// That a change did not happen. `what` begins the line: "cannot subscribe to http://...".
Failure ofChange(const std::string& what, const std::optional<OVError>& error);

}  // namespace Commands::Trouble
