#pragma once

#include "ExitStatus.h"
#include "Verb.h"

#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace Commands {

/// Finds out what the arguments ask for, and has it done.
class CommandLine {
 public:
    CommandLine();

    /// `words` are what stands behind the program's name. Says on standard error what is wrong with
    /// them, or what failed.
    ExitStatus run(const std::vector<std::string>& words);

 private:
    std::vector<const VerbSpec*> specs() const;
    Verb& verbOf(const std::string& name) const;
    ExitStatus runProgram(const std::string& option) const;
    ExitStatus runVerb(Verb& verb, const std::vector<std::string>& words) const;
    template <class V, class... Args>
    void add(Args&&... args) {
        mVerbs.push_back(std::make_unique<V>(std::forward<Args>(args)...));
    }

    std::vector<std::unique_ptr<Verb>> mVerbs;  ///< in the order of the help
};

}  // namespace Commands
