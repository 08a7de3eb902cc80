#pragma once

#include "Verb.h"

namespace Commands {

/// `orvane rm`: ends subscriptions.
class RemoveVerb : public Verb {
 public:
    const VerbSpec& getSpec() const override;
    ExitStatus run(const Arguments& arguments) override;
};

}  // namespace Commands
