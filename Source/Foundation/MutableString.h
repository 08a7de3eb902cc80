#pragma once

#include "Foundation/String.h"

#include <span>
#include <string>
#include <string_view>

namespace Foundation {

/// A text that can grow. While it is a key of a dictionary it must not change.
class MutableString : public String {
 public:
    /// An empty text.
    static Returner<MutableString> mutableString() { return mutableString(std::string()); }
    /// UTF-8 that is known to be valid.
    static Returner<MutableString> mutableString(std::string utf8) {
        return Returner<MutableString>(new MutableString(std::move(utf8)));
    }
    using String::mutableString;

    /// Adds a text, which may be null or this.
    void append(const String* other) { mText.append(String::view(other)); }
    /// Adds UTF-8 that is known to be valid.
    void append(std::string_view utf8) { mText.append(utf8); }

    /// Adds a text as `stringWithFormat` gives it.
    template <class... Args>
    void appendFormat(OVFormatString<Args...> format, const Args&... arguments) {
        mText += OVFormat(format, arguments...);
    }
    /// The same for a format that is known at run time only, which may be null.
    template <class... Args>
    void appendFormat(const String* format, const Args&... arguments) {
        OVWithFormatArguments(
            [&](std::span<const OVFormatArgument> list) { appendFormatAndArgs(format, list); },
            arguments...);
    }
    void appendFormatAndArgs(const String* format, std::span<const OVFormatArgument> arguments);

    void removeAll() { mText.clear(); }

    /// Lives on in the pool when the text changes.
    const char* toCString() const override;
    /// The text as it is now.
    StringReturner toString() const override { return string(mText); }

 private:
    using String::String;
};

}  // namespace Foundation
