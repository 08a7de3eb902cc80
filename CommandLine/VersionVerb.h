#pragma once

#include "Verb.h"

namespace Commands {

/// `orvane version`.
class VersionVerb : public Verb {
 public:
    const VerbSpec& getSpec() const override;
    ExitStatus run(const Arguments& arguments) override;
};

}  // namespace Commands
