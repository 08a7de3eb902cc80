#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace Commands::Suggestion {

/// How many letters must be changed, added, dropped or swapped with their neighbour to make one
/// word of the other (the optimal string alignment distance).
std::size_t distance(std::string_view a, std::string_view b);

/// The candidate that somebody who typed `word` most likely meant; empty if none is near.
std::string closest(std::string_view word, const std::vector<std::string>& candidates);

}  // namespace Commands::Suggestion
