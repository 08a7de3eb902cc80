#pragma once

#include "Verb.h"

#include <functional>
#include <vector>

namespace Commands {

/// `orvane help`: the manual of the program or of a verb.
class HelpVerb : public Verb {
 public:
    using Verbs = std::vector<const VerbSpec*>;

    /// `verbs` gives the tables of all verbs, this one's as well.
    explicit HelpVerb(std::function<Verbs()> verbs) : mVerbs(std::move(verbs)) {}

    const VerbSpec& getSpec() const override;
    ExitStatus run(const Arguments& arguments) override;

 private:
    std::function<Verbs()> mVerbs;
};

}  // namespace Commands
