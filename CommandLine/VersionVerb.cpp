#include "VersionVerb.h"

#include "CommonOptions.h"
#include "ListingWriter.h"
#include "Output.h"

namespace Commands {

const VerbSpec& VersionVerb::getSpec() const {
    static const VerbSpec sSpec{
        .name = "version",
        .summary = "tell the version",
        .options = CommonOptions::output(),
        .details = "The version of the program, and of what --json writes.",
    };
    return sSpec;
}

ExitStatus VersionVerb::run(const Arguments& arguments) {
    if (!arguments.has("json") && !arguments.has("jsonl")) {
        Output::write("orvane " ORVANE_VERSION "\n");
        return ExitStatus::Done;
    }
    ListingWriter::writeObject({"version", {{"version"}}, {{{std::string(ORVANE_VERSION)}}}},
                               arguments);
    return ExitStatus::Done;
}

}  // namespace Commands
