#pragma once

#include "Arguments.h"
#include "ExitStatus.h"
#include "VerbSpec.h"

namespace Commands {

/// One thing that the program can do: the first word behind its name.
class Verb {
 public:
    Verb() = default;
    virtual ~Verb() = default;
    Verb(const Verb&) = delete;
    Verb& operator=(const Verb&) = delete;

    /// Its table, which lives as long as it does.
    virtual const VerbSpec& getSpec() const = 0;
    /// Does it. Throws `Failure`, or whatever else derives from `std::exception`, if the whole of
    /// it has failed.
    virtual ExitStatus run(const Arguments& arguments) = 0;
};

}  // namespace Commands
