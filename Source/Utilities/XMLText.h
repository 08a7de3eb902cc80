#pragma once

#include <string>
#include <string_view>

/// Texts between us and libxml2, whose characters are unsigned.
namespace Orvane {

/// A text for libxml2, null for null. Valid as long as `text`.
inline const unsigned char* xmlChars(const char* text) {
    return reinterpret_cast<const unsigned char*>(text);
}
inline const unsigned char* xmlChars(const std::string& text) {
    return xmlChars(text.c_str());
}
/// A text of libxml2, null for null.
inline const char* xmlCString(const unsigned char* text) {
    return reinterpret_cast<const char*>(text);
}
/// The same, empty for null.
inline std::string_view xmlView(const unsigned char* text) {
    return text ? std::string_view(xmlCString(text)) : std::string_view();
}

}  // namespace Orvane
