#pragma once

#include <string>

namespace Commands::JSONText {

/// Escapes the characters beyond ASCII that many programs take for the end of a line as well. They
/// stand in strings alone.
void escapeLineEnds(std::string& json);

}  // namespace Commands::JSONText
