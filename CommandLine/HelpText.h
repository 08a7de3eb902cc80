#pragma once

#include "VerbSpec.h"

#include <string>
#include <vector>

namespace Commands::HelpText {

inline constexpr const char* kExitCodes[] = {
    "done",
    "nothing matched",
    "wrong usage",
    "unknown or ambiguous name",
    "partly failed",
    "failed",
    "needs a login",
    "agent not reachable",
    "database not usable",
};

/// How an option is shown: "-n, --limit N".
std::string optionLabel(const OptionSpec& option);
/// How a verb is called: "orvane entries [OPTION...] [ENTRY...]".
std::string usage(const VerbSpec& verb);

/// The verbs with what they do, for "orvane -h".
std::string program(const std::vector<const VerbSpec*>& verbs);
/// The same with all that can be said of the program as a whole, for "orvane --help".
std::string programManual(const std::vector<const VerbSpec*>& verbs);
/// The options of a verb, for "-h".
std::string verb(const VerbSpec& verb);
/// The same with details, examples and exit statuses, for "--help".
std::string verbManual(const VerbSpec& verb);

/// What goes for all verbs, in paragraphs.
const char* generalDetails();

}  // namespace Commands::HelpText
