#pragma once

#include "Listing.h"

#include <string>

namespace Commands::ListingJSON {

/// The version of what is written. It grows when something is taken away or changes its meaning.
inline constexpr int kSchema = 1;

/// One document: the schema's version and the list by its name.
std::string document(const Listing& listing);
/// One document that is the only row itself. REQUIRES: one row.
std::string object(const Listing& listing);
/// An object on a line for each row. Each has the schema's version.
std::string lines(const Listing& listing);

}  // namespace Commands::ListingJSON
