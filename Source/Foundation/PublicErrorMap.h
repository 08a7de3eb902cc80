#pragma once

#include "Foundation/NetError.h"

namespace Foundation {

/// A domain and a code as applications know them.
struct PublicError {
    const char* domain;
    int code;
};

/// The public domain and code of an error; `OVInternalError` for one that has none.
PublicError mapToPublicError(const NetError& error);

}  // namespace Foundation
