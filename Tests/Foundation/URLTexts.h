#pragma once

#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"

#include <string>
#include <string_view>

/// URLs from plain texts and back, for tests of them.

/// The text of a string that may be null, which prints as "(null)".
inline std::string text(Foundation::StringReturner string) {
    const Foundation::Ref<Foundation::String> held(std::move(string));
    return held ? held->utf8() : "(null)";
}

inline Foundation::Ref<Foundation::URL> strict(std::string_view spelling,
                                               Foundation::URL* base = nullptr) {
    const Foundation::Ref<Foundation::String> string =
        Foundation::String::string(std::string(spelling));
    return Foundation::URL::url(string, base);
}

inline Foundation::Ref<Foundation::URL> lenient(std::string_view spelling,
                                                Foundation::URL* base = nullptr) {
    const Foundation::Ref<Foundation::String> string =
        Foundation::String::string(std::string(spelling));
    return Foundation::URL::lenientURL(string, base);
}
