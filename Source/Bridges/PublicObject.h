#pragma once

#include <Orvane/OVObject.h>

#include <memory>

namespace Orvane {

class Core;

std::shared_ptr<OVObject> publicObjectOf(Core* row);

/// The public object of a row, made on first use; null for null. Throws `AssertionFailure` if it
/// cannot be made.
template <class T>
std::shared_ptr<T> publicObject(Core* row) {
    return std::static_pointer_cast<T>(publicObjectOf(row));
}

}  // namespace Orvane
