#pragma once

#include "Foundation/AssertionFailure.h"

#include <string>

namespace Support {

/// What the `AssertionFailure` says that `body` throws; "none" if it throws none.
template <class Body>
std::string assertionOf(Body&& body) {
    try {
        body();
    } catch (const Foundation::AssertionFailure& failure) {
        return failure.what();
    }
    return "none";
}

}  // namespace Support
