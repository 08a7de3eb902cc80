#pragma once

#include <cstdint>

namespace Orvane {

/// Changes one column of a row for a client: with the row's leave, and with what it makes of that.
template <class T, class Setter>
void setColumn(std::int64_t rowID, int column, Setter&& set) {
    T* row = T::getRow(rowID);
    row->ipcWillChangeColumn(column);
    set(*row);
    row->ipcDidChangeColumn(column);
}

}  // namespace Orvane
