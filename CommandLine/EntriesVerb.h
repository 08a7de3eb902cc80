#pragma once

#include "Verb.h"

namespace Commands {

/// `orvane entries`: the entries that the options choose.
class EntriesVerb : public Verb {
 public:
    const VerbSpec& getSpec() const override;
    ExitStatus run(const Arguments& arguments) override;
};

}  // namespace Commands
