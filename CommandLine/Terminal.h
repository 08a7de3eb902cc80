#pragma once

#include <cstddef>

namespace Commands::Terminal {

/// Whether standard output, or standard error, is a terminal.
bool isOutput();
bool isError();
/// Whether colours are wanted there: not in a pipe, on a terminal that has none, or with NO_COLOR
/// in the environment.
bool hasColours();
/// The columns of the terminal; 80 where that cannot be told.
std::size_t width();

}  // namespace Commands::Terminal
