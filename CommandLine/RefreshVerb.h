#pragma once

#include "Verb.h"

namespace Commands {

/// `orvane refresh`: has the agent look for what is new, and says what came of it.
class RefreshVerb : public Verb {
 public:
    const VerbSpec& getSpec() const override;
    ExitStatus run(const Arguments& arguments) override;
};

}  // namespace Commands
