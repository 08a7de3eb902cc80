#pragma once

namespace Foundation {

/// A switch in the environment. Unset, and values that begin with "no" in any case or with "0",
/// are false; all else is true.
bool GetBoolEnv(const char* name);

/// A switch that the environment or else the application's preferences may set. In the
/// environment "NO" and "0" are false and all else true, up to 100 characters. A preference that
/// reads as a boolean is that; any other is false if it equals "0" or "NO". `defaultValue` holds
/// where neither is set.
bool GetBoolPref(const char* name, bool defaultValue);

}  // namespace Foundation
