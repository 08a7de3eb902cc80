#pragma once

#include "ExitStatus.h"

#include <stdexcept>
#include <string>

namespace Commands {

/// Why a verb ends before its work is done. The text says what is wrong and what the user can do
/// about it.
class Failure : public std::runtime_error {
 public:
    Failure(ExitStatus status, const std::string& text)
        : std::runtime_error(text), mStatus(status) {}

    ExitStatus getStatus() const { return mStatus; }

 private:
    ExitStatus mStatus;
};

}  // namespace Commands
