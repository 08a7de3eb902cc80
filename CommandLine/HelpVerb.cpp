#include "HelpVerb.h"

#include "HelpText.h"
#include "Pager.h"
#include "VerbNames.h"

namespace Commands {

const VerbSpec& HelpVerb::getSpec() const {
    static const VerbSpec sSpec{
        .name = "help",
        .summary = "show the manual of the program or of a verb",
        .operands = "[VERB]",
        .most = 1,
        .details = "The same as \"orvane --help\" and \"orvane VERB --help\".",
        .examples = {"help entries"},
    };
    return sSpec;
}

ExitStatus HelpVerb::run(const Arguments& arguments) {
    const Verbs verbs = mVerbs();
    if (arguments.operands().empty()) {
        Pager::show(HelpText::programManual(verbs));
    } else {
        Pager::show(HelpText::verbManual(VerbNames::find(arguments.operands()[0], verbs)));
    }
    return ExitStatus::Done;
}

}  // namespace Commands
