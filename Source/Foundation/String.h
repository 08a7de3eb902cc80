#pragma once

#include "Foundation/Bytes.h"
#include "Foundation/PFRefCounted.h"
#include "Foundation/Returner.h"

#include <Orvane/OVFormat.h>

#include <string>
#include <string_view>

namespace Foundation {

/// An immutable text. Kept, and given to the outside, as UTF-8.
class String : public PFRefCounted {
 public:
    /// The text of a UTF-8 C string; null for null and, with a warning, for what is not UTF-8.
    static StringReturner string(const char* utf8);
    /// The text of UTF-8 that is known to be valid, such as what this process formatted.
    static StringReturner string(std::string utf8);

    /// The text of the file that a URL names, in UTF-8. Throws `AssertionFailure` where it cannot
    /// be read or is not UTF-8, and for null.
    static StringReturner stringFromResource(URL* url);

    template <class... Args>
    static StringReturner stringWithFormat(OVFormatString<Args...> format,
                                           const Args&... arguments) {
        return string(OVFormat(format, arguments...));
    }

    /// Two lower-case hexadecimal digits for each byte.
    static StringReturner hexString(Bytes bytes);

    std::size_t getHash() const override;
    /// The hash of a string of this text.
    static std::size_t hashOf(std::string_view utf8);
    bool isEqual(const PFRefCounted* other) const override;
    StringReturner toString() const override;

    /// The text as UTF-8. Valid as long as the string.
    std::string_view view() const { return mText; }
    const std::string& utf8() const { return mText; }

 protected:
    explicit String(std::string utf8) : mText(std::move(utf8)) {}

    std::string mText;
};

/// The text of an object's `toString`, which the current pool owns; null for null, and
/// "BAD_OBJECT(%p)" for a pointer that cannot be one.
String* ToString(const PFRefCounted* object);
String* ToString(const RefCounted* object);

}  // namespace Foundation
