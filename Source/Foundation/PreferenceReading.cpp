#include "Foundation/PreferenceReading.h"

#include "Foundation/Number.h"
#include "Foundation/String.h"

#include <glib.h>

#include <algorithm>
#include <charconv>
#include <climits>
#include <cmath>
#include <cstdint>
#include <string>
#include <string_view>

namespace Foundation {

namespace {

template <class T>
const T* as(const PFRefCounted* value) {
    return dynamic_cast<const T*>(value);
}

bool isOneOf(const String& text, std::initializer_list<const char*> words) {
    return std::any_of(words.begin(), words.end(), [&](const char* word) {
        return g_ascii_strcasecmp(text.utf8().c_str(), word) == 0;
    });
}

int cutToInt(std::int64_t value) {
    return static_cast<int>(std::clamp<std::int64_t>(value, INT_MIN, INT_MAX));
}

int leadingInt(const std::string& text) {
    // What 64 bits cannot hold is cut to their range already.
    return cutToInt(g_ascii_strtoll(text.c_str(), nullptr, 10));
}

double leadingDouble(std::string_view text) {
    while (!text.empty() && g_ascii_isspace(text.front()))
        text.remove_prefix(1);
    // The standard's reader knows no plus sign.
    if (text.starts_with('+') && !text.starts_with("+-")) text.remove_prefix(1);
    double value = 0.0;
    std::from_chars(text.data(), text.data() + text.size(), value);
    return std::isfinite(value) ? value : 0.0;
}

}  // namespace

std::optional<bool> PreferenceReading::asBool(const PFRefCounted* value) {
    if (const auto* number = as<Number>(value)) return number->getBool();
    const auto* text = as<String>(value);
    if (!text) return std::nullopt;
    if (isOneOf(*text, {"true", "yes", "1"})) return true;
    if (isOneOf(*text, {"false", "no", "0"})) return false;
    return std::nullopt;
}

bool PreferenceReading::asSwitch(const PFRefCounted* value) {
    // "0" and "NO" are truth values already.
    return asBool(value).value_or(true);
}

int PreferenceReading::asInt(const PFRefCounted* value) {
    if (const auto* number = as<Number>(value)) return cutToInt(number->getInteger());
    const auto* text = as<String>(value);
    return text ? leadingInt(text->utf8()) : 0;
}

double PreferenceReading::asDouble(const PFRefCounted* value) {
    if (const auto* number = as<Number>(value)) return number->getReal();
    const auto* text = as<String>(value);
    return text ? leadingDouble(text->view()) : 0.0;
}

StringReturner PreferenceReading::asString(const PFRefCounted* value) {
    if (!value) return String::string("");
    if (as<String>(value) || as<Number>(value)) return value->toString();
    return nullptr;
}

}  // namespace Foundation
