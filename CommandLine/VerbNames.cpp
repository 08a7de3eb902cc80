#include "VerbNames.h"

#include "Failure.h"
#include "Suggestion.h"

namespace Commands {

const VerbSpec& VerbNames::find(const std::string& name,
                                const std::vector<const VerbSpec*>& verbs) {
    std::vector<std::string> names;
    for (const VerbSpec* verb : verbs) {
        if (name == verb->name) return *verb;
        names.emplace_back(verb->name);
    }
    const std::string close = Suggestion::closest(name, names);
    throw Failure(ExitStatus::Usage,
                  "there is no verb \"" + name + '"' +
                      (close.empty() ? "" : "; did you mean \"" + close + "\"?"));
}

}  // namespace Commands
