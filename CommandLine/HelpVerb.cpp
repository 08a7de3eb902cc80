#include "HelpVerb.h"

#include "HelpText.h"
#include "ManualPage.h"
#include "Output.h"
#include "Pager.h"
#include "VerbNames.h"

namespace Commands {

const VerbSpec& HelpVerb::getSpec() const {
    static const VerbSpec sSpec{
        .name = "help",
        .summary = "show the manual of the program or of a verb",
        .operands = "[VERB]",
        .most = 1,
        .options = {{"mdoc", 0, "", "Write the manual page, in mdoc(7)"}},
        .details = "The same as \"orvane --help\" and \"orvane VERB --help\".",
        .examples = {"help entries"},
    };
    return sSpec;
}

ExitStatus HelpVerb::run(const Arguments& arguments) {
    const Verbs verbs = mVerbs();
    const bool isPage = arguments.has("mdoc");
    const std::vector<std::string>& words = arguments.operands();
    if (isPage) {
        Output::write(words.empty() ? ManualPage::program(verbs)
                                    : ManualPage::verb(VerbNames::find(words[0], verbs)));
    } else if (words.empty()) {
        Pager::show(HelpText::programManual(verbs));
    } else {
        Pager::show(HelpText::verbManual(VerbNames::find(words[0], verbs)));
    }
    return ExitStatus::Done;
}

}  // namespace Commands
