#pragma once

#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"

#include <string>

// Values and free rows for tests. They live until the current pool drains.

inline Foundation::String* str(const std::string& text) {
    return Foundation::String::string(text);
}
inline Foundation::URL* url(const char* text) {
    return Foundation::URL::url(str(text));
}
inline Foundation::Data* bytes(const std::string& content) {
    return Foundation::Data::adopt(content);
}
inline Foundation::Date* date(double seconds) {
    return Foundation::Date::date(seconds);
}

/// What a text that may be null says; "(null)" for null.
inline std::string textOf(const Foundation::String* text) {
    return text ? text->utf8() : "(null)";
}
inline std::string textOf(const Foundation::Data* data) {
    return data ? std::string(data->view()) : "(null)";
}
inline std::string textOf(const Foundation::URL* url) {
    return url ? url->text() : "(null)";
}

/// The SHA-1 in hexadecimal.
inline std::string sha1(const std::string& content) {
    return textOf(bytes(content)->SHA1HashString());
}

template <class T>
T* make() {
    return Foundation::Returner<T>::adopted(new T);
}
