#pragma once

#include "Foundation/ArrayOf.h"
#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Foundation/TimeZone.h"
#include "Foundation/URL.h"

#include <Orvane/OVDate.h>

#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// From the values of the core to those of applications, and back. Null is none.

namespace Orvane {

std::optional<std::string> textOf(const Foundation::String* string);
/// The absolute form.
std::optional<std::string> textOf(const Foundation::URL* url);
/// The name.
std::optional<std::string> textOf(const Foundation::TimeZone* zone);
std::optional<std::string> bytesOf(const Foundation::Data* data);
std::optional<OVDate> dateOf(const Foundation::Date* date);

// Each throws `ParameterException` for what it cannot make a value of.

Foundation::Ref<Foundation::String> stringOf(const std::string& text);
Foundation::Ref<Foundation::String> stringOf(const std::optional<std::string>& text);
/// An absolute URL, of any spelling.
Foundation::Ref<Foundation::URL> urlOf(const std::string& text);
/// Null for an empty text too.
Foundation::Ref<Foundation::URL> urlOf(const std::optional<std::string>& text);
Foundation::Ref<Foundation::Date> dateOf(const std::optional<OVDate>& date);
Foundation::Ref<Foundation::ArrayOf<Foundation::String>> stringsOf(
    const std::optional<std::vector<std::string>>& texts);

}  // namespace Orvane
