#pragma once

#include "Verb.h"

namespace Commands {

/// `orvane export`: lists of feeds for other programs.
class ExportVerb : public Verb {
 public:
    const VerbSpec& getSpec() const override;
    ExitStatus run(const Arguments& arguments) override;
};

}  // namespace Commands
