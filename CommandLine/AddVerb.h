#pragma once

#include "Verb.h"

namespace Commands {

/// `orvane add`: subscribes to feeds, which it looks for where that is needed.
class AddVerb : public Verb {
 public:
    const VerbSpec& getSpec() const override;
    ExitStatus run(const Arguments& arguments) override;
};

}  // namespace Commands
