#pragma once

#include "Value.h"

#include <string>
#include <vector>

namespace Commands {

/// Rows of values with what they are called: what a verb has to show, whatever it is shown as.
struct Listing {
    struct Column {
        enum class Kind {
            Plain,
            Number,      ///< stands at the right
            Bytes,       ///< a size, which people read as "1.5 MB"
            Identifier,  ///< is cut to what tells it from the others
            Flexible,    ///< is cut where the terminal is narrow
        };
        const char* key;         ///< in JSON
        const char* title = "";  ///< above a table; without one it is in JSON alone
        Kind kind = Kind::Plain;
    };
    /// How a row looks on a terminal that has colours.
    enum class Style { Plain, Strong, Faint, Bad };
    struct Row {
        std::vector<Value> values;  ///< one for each column
        Style style = Style::Plain;
    };

    const char* name;  ///< of the list in JSON
    std::vector<Column> columns;
    std::vector<Row> rows;
};

}  // namespace Commands
