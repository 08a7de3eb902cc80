#pragma once

#include <string>

namespace Commands::Pager {

/// Shows a text: on a terminal by the program that PAGER names, "less" if it names none; in a pipe,
/// or where that program is not there, as it is.
void show(const std::string& text);

}  // namespace Commands::Pager
