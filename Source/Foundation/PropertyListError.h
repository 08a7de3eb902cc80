#pragma once

#include <stdexcept>

namespace Foundation {

/// Why something is not, or cannot become, a property list. Does not leave `PropertyList`.
class PropertyListError : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;
};

}  // namespace Foundation
