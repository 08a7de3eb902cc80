#pragma once

#include "Verb.h"

namespace Commands {

/// `orvane doctor`: what is wrong, and what can be done about it.
class DoctorVerb : public Verb {
 public:
    const VerbSpec& getSpec() const override;
    ExitStatus run(const Arguments& arguments) override;
};

}  // namespace Commands
