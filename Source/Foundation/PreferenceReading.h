#pragma once

#include "Foundation/Returner.h"

#include <optional>

namespace Foundation {

class PFRefCounted;

/// How the values of preferences read as each type. People edit preferences by hand, so numbers may
/// be written as texts and the other way round. Every function takes null, an absent value. Any
/// thread.
struct PreferenceReading {
    /// A number that is not 0 is true. Of the texts, "true", "yes" and "1" are true and "false",
    /// "no" and "0" false, in any case of letters. Nothing else is a truth value.
    static std::optional<bool> asBool(const PFRefCounted* value);
    /// A truth value as such; any other value is false if it equals "0" or "NO". REQUIRES: there is
    /// a value.
    static bool asSwitch(const PFRefCounted* value);
    /// A number, cut towards 0; of a text, the decimal integer that it begins with, after blanks.
    /// Cut to the range of `int`. All else is 0.
    static int asInt(const PFRefCounted* value);
    /// A number; of a text, the decimal number that it begins with, after blanks, if it is finite.
    /// All else is 0.0.
    static double asDouble(const PFRefCounted* value);
    /// A text as such, a number as its text, an absent value as the empty text; all else is null.
    static StringReturner asString(const PFRefCounted* value);
};

}  // namespace Foundation
