#pragma once

#include "Foundation/DateFormat.h"

#include <span>

namespace Foundation {

/// Every format of dates, in the order of trial.
std::span<const DateFormat> dateFormats() noexcept;

}  // namespace Foundation
