#pragma once

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Logger.h"

namespace Foundation {

/// The barrier around every callback: runs `body` inside an `AutoreleasePool` and reports whatever
/// it throws under `where`, the signature of the callback. Nothing leaves it.
template <class Body>
void callGuarded(const char* where, Body&& body) noexcept {
    try {
        AutoreleasePool pool;
        try {
            body();
        } catch (...) {
            warnAboutCurrentException(where);
        }
    } catch (...) {
        // Only a pool that could not be opened or closed gets here.
        warnAboutCurrentException(where);
    }
}

}  // namespace Foundation
