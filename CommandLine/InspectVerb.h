#pragma once

#include "Verb.h"

namespace Commands {

/// `orvane inspect`: what the parser makes of documents.
class InspectVerb : public Verb {
 public:
    const VerbSpec& getSpec() const override;
    ExitStatus run(const Arguments& arguments) override;
};

}  // namespace Commands
