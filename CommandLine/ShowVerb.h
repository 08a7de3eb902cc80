#pragma once

#include "Verb.h"

namespace Commands {

/// `orvane show`: what an entry says.
class ShowVerb : public Verb {
 public:
    const VerbSpec& getSpec() const override;
    ExitStatus run(const Arguments& arguments) override;
};

}  // namespace Commands
