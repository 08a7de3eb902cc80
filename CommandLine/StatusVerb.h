#pragma once

#include "Verb.h"

namespace Commands {

/// `orvane status`: the agent, the counts and the disk, on one screen.
class StatusVerb : public Verb {
 public:
    const VerbSpec& getSpec() const override;
    ExitStatus run(const Arguments& arguments) override;
};

}  // namespace Commands
