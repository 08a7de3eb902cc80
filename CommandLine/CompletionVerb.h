#pragma once

#include "Verb.h"

#include <functional>
#include <utility>
#include <vector>

namespace Commands {

/// `orvane completion`: scripts for shells.
class CompletionVerb : public Verb {
 public:
    using Verbs = std::vector<const VerbSpec*>;

    /// `verbs` gives the tables of all verbs.
    explicit CompletionVerb(std::function<Verbs()> verbs) : mVerbs(std::move(verbs)) {}

    const VerbSpec& getSpec() const override;
    ExitStatus run(const Arguments& arguments) override;

 private:
    std::function<Verbs()> mVerbs;
};

}  // namespace Commands
