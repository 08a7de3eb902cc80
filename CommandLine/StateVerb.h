#pragma once

#include "Verb.h"

#include <Orvane/OVClient.h>

namespace Commands {

/// `orvane mark`, `flag` and `unflag`: what entries are for the user.
class StateVerb : public Verb {
 public:
    enum class Kind { Mark, Flag, Unflag };

    explicit StateVerb(Kind kind) : mKind(kind) {}

    const VerbSpec& getSpec() const override;
    ExitStatus run(const Arguments& arguments) override;

 private:
    /// What entries are to become.
    struct Target {
        std::optional<bool> read;
        std::optional<bool> flagged;
        std::string word;
    };

    Target targetOf(const Arguments& arguments) const;

    Kind mKind;
};

}  // namespace Commands
