#pragma once

#include "Listing.h"

#include <cstddef>
#include <string>

namespace Commands::ListingText {

/// How a table looks.
struct Look {
    std::size_t width = 80;  ///< in columns
    bool hasColours = false;
    OVDate now;  ///< what dates are told from
};

/// A table for people, with a line of titles. Columns that are flexible share what the others
/// leave.
std::string table(const Listing& listing, const Look& look);

/// A line for each row, with tabs in between: the same columns, with nothing cut, and dates of ISO
/// 8601.
std::string lines(const Listing& listing);

/// A value as it stands in a table.
std::string shown(const Value& value, Listing::Column::Kind kind, const OVDate& now);

/// A value as it stands in a pipe.
std::string plain(const Value& value);

/// How many characters of an identifier tell it from all others of the list: at least 7.
std::size_t identifierLength(const std::vector<std::string>& identifiers);

}  // namespace Commands::ListingText
