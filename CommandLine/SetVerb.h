#pragma once

#include "Verb.h"

namespace Commands {

/// `orvane set`: shows and changes how feeds are looked after.
class SetVerb : public Verb {
 public:
    const VerbSpec& getSpec() const override;
    ExitStatus run(const Arguments& arguments) override;
};

}  // namespace Commands
