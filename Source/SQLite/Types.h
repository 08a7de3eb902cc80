#pragma once

#include <cstdint>

namespace SQLite {

/// Identifies a row in its table. Above 0 for a saved row, 0 for one that is not in the file.
using RowID = long long;

/// A column's place in its table, counted from 0 behind the row identifier.
using ColumnID = int;

/// Which of a row's columns, by their places in the list of its class.
using ColumnMask = std::uint64_t;

}  // namespace SQLite
