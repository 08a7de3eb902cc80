#pragma once

#include "Foundation/BusMessage.h"

#include <optional>
#include <string>

namespace Foundation {

/// Which signals are wanted. What is left empty does not matter.
struct BusMatch {
    std::string sender =
        {};  ///< a well-known name stands for whoever owns it when the signal comes
    std::string path = {};
    std::string interface = {};
    std::string member = {};
    std::optional<std::string> argument0 = {};  ///< the first argument, a string
    std::optional<std::string> argument1 = {};

    /// The rule that asks the bus for them (D-Bus Specification, "Match Rules").
    std::string getRule() const;
    /// Whether the message is one of them. The bus must be asked, but not trusted, for a signal
    /// that is addressed to one connection comes whatever the rules are. Leaves the sender out of
    /// account.
    bool matches(const BusMessage& message) const;
};

}  // namespace Foundation
