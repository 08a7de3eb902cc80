#pragma once

#include "Foundation/UniqueFD.h"

#include <map>
#include <string>
#include <vector>

namespace Support {

/// Stands where the system's journal does, for this process alone: in a mount namespace with a
/// /run of its own, it holds the socket that the journal's messages go to. The process stays in
/// the namespace.
class PrivateJournal {
 public:
    PrivateJournal();

    /// Why there is no such namespace; empty if there is one.
    const std::string& problem() const { return mProblem; }

    /// The messages that came since the last call, each by field.
    std::vector<std::map<std::string, std::string>> takeMessages();

 private:
    std::string mProblem;
    Foundation::UniqueFD mSocket;
};

}  // namespace Support
