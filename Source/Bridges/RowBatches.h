#pragma once

#include "Agent/RPC/ArgumentTypes.h"
#include "SQLite/Types.h"

#include <algorithm>
#include <cstddef>
#include <vector>

namespace Orvane {

/// Calls `call(rowIDs, count)` for all of the IDs, with no more at once than the agent takes in a
/// call; not at all for none.
template <class Call>
void inBatches(const std::vector<SQLite::RowID>& rowIDs, Call call) {
    for (std::size_t i = 0; i < rowIDs.size(); i += RPC::kMaximumRowIDs) {
        const std::size_t count = std::min(rowIDs.size() - i, RPC::kMaximumRowIDs);
        call(rowIDs.data() + i, static_cast<unsigned>(count));
    }
}

}  // namespace Orvane
