#pragma once

#include "ExitStatus.h"

namespace CLI {
class App;
}

namespace Commands {

/// One thing that the program can do: the first word behind its name.
class Verb {
 public:
    Verb() = default;
    virtual ~Verb() = default;
    Verb(const Verb&) = delete;
    Verb& operator=(const Verb&) = delete;

    virtual const char* getName() const = 0;
    /// What it does, in a few words, for the list of all verbs.
    virtual const char* getSummary() const = 0;
    /// Declares options and arguments, which parsing stores here, and the rest of the help.
    virtual void addOptions(CLI::App& app) = 0;
    /// Does it. May throw what derives from `std::exception`: the whole of it has failed then.
    virtual ExitStatus run() = 0;
};

}  // namespace Commands
