#pragma once

#include "Foundation/String.h"
#include "Foundation/URL.h"

#include <cstdint>
#include <span>
#include <string>

namespace Orvane {

// The values that arguments of routines stand for. None for no bytes; all throw `AssertionFailure`
// for what is no UTF-8.

Foundation::StringReturner getLongString(std::span<const std::uint8_t> bytes);
/// None for an empty text.
Foundation::StringReturner getCString255(const std::string& text);
/// None for what is no URL.
Foundation::URLReturner getURL(std::span<const std::uint8_t> bytes);

}  // namespace Orvane
