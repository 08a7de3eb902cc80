#pragma once

#include <Orvane/OVException.h>

namespace Orvane {

/// The application gave an operation what it cannot take.
class ParameterException : public OVException {
 public:
    using OVException::OVException;
};

}  // namespace Orvane
