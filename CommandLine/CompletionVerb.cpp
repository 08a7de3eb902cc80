#include "CompletionVerb.h"

#include "Completion.h"
#include "Failure.h"
#include "Output.h"

namespace Commands {

const VerbSpec& CompletionVerb::getSpec() const {
    static const VerbSpec sSpec{
        .name = "completion",
        .summary = "write what a shell completes words by",
        .operands = "bash|zsh|fish",
        .fewest = 1,
        .most = 1,
        .kind = WordKind::Choice,
        .choices = {"bash", "zsh", "fish"},
        .details =
            "The script completes verbs, options, and the identifiers of feeds and entries. "
            "It is installed with orvane; this is for who has it elsewhere.",
        .examples = {"completion bash > ~/.local/share/bash-completion/completions/orvane",
                     "completion fish > ~/.config/fish/completions/orvane.fish"},
    };
    return sSpec;
}

ExitStatus CompletionVerb::run(const Arguments& arguments) {
    const std::string& shell = arguments.operands()[0];
    if (shell == "bash") {
        Output::write(Completion::bash(mVerbs()));
    } else if (shell == "zsh") {
        Output::write(Completion::zsh(mVerbs()));
    } else if (shell == "fish") {
        Output::write(Completion::fish(mVerbs()));
    } else {
        throw Failure(ExitStatus::Usage,
                      "there is no completion for \"" + shell + "\"; it is bash, zsh or fish");
    }
    return ExitStatus::Done;
}

}  // namespace Commands
