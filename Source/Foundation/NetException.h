#pragma once

#include "Foundation/NetError.h"

#include <stdexcept>

namespace Foundation {

/// A `NetError` on its way up. `what()` is the error's text.
class NetException : public std::runtime_error {
 public:
    explicit NetException(const NetError& error)
        : std::runtime_error(error.description()), mError(error) {}
    NetException(std::int64_t domain, std::int32_t code) : NetException(NetError(domain, code)) {}

    const NetError& getError() const { return mError; }
    std::int64_t getDomain() const { return mError.domain; }
    std::int32_t getCode() const { return mError.code; }

 private:
    NetError mError;
};

}  // namespace Foundation
