#pragma once

namespace Orvane {

/// Whether a byte is what the text routines call a blank.
constexpr bool isBlank(char c) {
    return c == ' ' || c == '\t' || c == '\n' || c == '\r';
}

}  // namespace Orvane
