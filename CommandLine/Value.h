#pragma once

#include <Orvane/OVDate.h>

#include <optional>
#include <string>
#include <variant>
#include <vector>

namespace Commands {

/// A value that verbs show: none, or a flag, a number, a text, a point in time or a list of texts.
using Value = std::variant<std::monostate, bool, long long, double, std::string, OVDate,
                           std::vector<std::string>>;

/// The value of something that may be missing.
template <class T>
Value valueOf(const std::optional<T>& part) {
    return part ? Value(*part) : Value();
}

}  // namespace Commands
