#pragma once

#include "Foundation/Returner.h"

#include <string>
#include <string_view>

namespace Orvane {

class ConnectionResponse;

/// The name that a server gives to a file: of its `Content-Disposition` (RFC 6266), or else the
/// last part of the URL's path; "download" if there is neither. It is one that a file can have
/// anywhere, and leads nowhere else.
Foundation::StringReturner suggestedFilename(const ConnectionResponse& response);

/// The value of a parameter behind the first ";" of a header; empty if there is none. `name` is
/// compared without case. An extended value ("name*=UTF-8''…", RFC 8187) goes before a plain one.
std::string headerParameter(std::string_view header, std::string_view name);

}  // namespace Orvane
