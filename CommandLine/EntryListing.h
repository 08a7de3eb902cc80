#pragma once

#include "Listing.h"

#include <Orvane/OVEntry.h>

namespace Commands::EntryListing {

/// How much of the entries is read.
enum class Extent {
    Lines,     ///< what stands in tables
    Complete,  ///< also what has to be looked for in other tables of the database
};

/// Entries in a list, in their order.
Listing of(const OVEntry::List& entries, Extent extent);

}  // namespace Commands::EntryListing
