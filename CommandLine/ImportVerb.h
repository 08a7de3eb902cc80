#pragma once

#include "Verb.h"

namespace Commands {

/// `orvane import`: lists of feeds from other programs.
class ImportVerb : public Verb {
 public:
    const VerbSpec& getSpec() const override;
    ExitStatus run(const Arguments& arguments) override;
};

}  // namespace Commands
