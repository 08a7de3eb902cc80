#pragma once

#include "Arguments.h"
#include "Listing.h"

namespace Commands::ListingWriter {

/// Writes a list as the options ask for it: as JSON, or for whoever reads standard output.
void write(const Listing& listing, const Arguments& arguments);

/// The same for the one row of a list: on a terminal and in a pipe it is a line for each value.
void writeObject(const Listing& listing, const Arguments& arguments);

}  // namespace Commands::ListingWriter
