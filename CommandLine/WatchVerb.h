#pragma once

#include "Verb.h"

namespace Commands {

/// `orvane watch`: what happens, as it happens.
class WatchVerb : public Verb {
 public:
    const VerbSpec& getSpec() const override;
    ExitStatus run(const Arguments& arguments) override;
};

}  // namespace Commands
