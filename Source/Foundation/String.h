#pragma once

#include "Foundation/Bytes.h"
#include "Foundation/PFRefCounted.h"
#include "Foundation/Returner.h"
#include "Foundation/StringComparison.h"
#include "Foundation/StringEncoding.h"

#include <Orvane/OVFormat.h>

#include <concepts>
#include <optional>
#include <span>
#include <string>
#include <string_view>

namespace Foundation {

template <class T>
class ArrayOf;
class MutableString;

/// An immutable text. Kept, and given to the outside, as UTF-8.
///
/// Places and lengths are counted in characters, that is in Unicode code points.
class String : public PFRefCounted {
 public:
    /// The text of a UTF-8 C string; null for null and, with a warning, for what is not UTF-8.
    static StringReturner string(const char* utf8);
    /// The same for a text that is handed over.
    static StringReturner stringOfUTF8(std::string utf8);
    /// The text of UTF-8 that is known to be valid, such as what this process formatted.
    static StringReturner string(std::string utf8);
    /// The text of bytes in an encoding, without a byte order mark at its start; null if they are
    /// not all text of that encoding.
    static StringReturner string(Bytes bytes, StringEncoding encoding);
    /// The same. Null for null and for a negative length.
    static StringReturner string(const void* bytes, long length, StringEncoding encoding);
    /// The same for a C string, in an encoding without zero bytes. Null for null.
    static StringReturner externalString(const char* bytes, StringEncoding encoding);

    /// The text of the file that a URL names, in UTF-8. Throws `AssertionFailure` where it cannot
    /// be read or is not UTF-8, and for null.
    static StringReturner stringFromResource(URL* url);
    /// The UTF-8 text that a base64 text stands for; null if it is not UTF-8, and for null.
    static StringReturner stringFromBase64(const String* base64);
    /// Two lower-case hexadecimal digits for each byte.
    static StringReturner hexString(Bytes bytes);
    /// The elements with the separator between them, null for an empty text in both; null if there
    /// is no array.
    static StringReturner stringByJoining(const ArrayOf<String>* elements, const String* separator);

    /// A text as `OVFormat` gives it.
    template <class... Args>
    static StringReturner stringWithFormat(OVFormatString<Args...> format,
                                           const Args&... arguments) {
        return string(OVFormat(format, arguments...));
    }
    /// The same for a format that is known at run time only, such as a translated one: a conversion
    /// that does not fit its argument prints as it stands. Null for null.
    template <class... Args>
    static StringReturner stringWithFormat(const String* format, const Args&... arguments) {
        return OVWithFormatArguments(
            [&](std::span<const OVFormatArgument> list) {
                return stringWithFormatAndArgs(format, list);
            },
            arguments...);
    }
    static StringReturner stringWithFormatAndArgs(const String* format,
                                                  std::span<const OVFormatArgument> arguments);

    /// The size of that many bytes, for people: "1 byte", "3.4 KB". A unit is 1024 of the one
    /// below; of negative sizes the sign is left out.
    static StringReturner representationForBytes(long long count);

    /// A copy that can be changed.
    Returner<MutableString> mutableCopy() const;
    /// As `string`.
    static Returner<MutableString> mutableString(const char* utf8);

    std::size_t getLength() const;
    bool isEmpty() const { return mText.empty(); }
    /// The same for a text that may be null.
    static bool isEmpty(const String* string) { return !string || string->isEmpty(); }

    /// The characters from `start` on, or `length` of them. What lies behind the end of the text is
    /// left out.
    StringReturner getSubstring(std::size_t start) const;
    StringReturner getSubstring(std::size_t start, std::size_t length) const;
    /// This text and then the other, which may be null.
    StringReturner getStringByAppendingString(const String* other) const;
    /// Mapped as in no language in particular: "ß" becomes "SS", and "I" becomes "i" in Turkish
    /// texts too.
    StringReturner getUpperCaseString() const;
    StringReturner getLowerCaseString() const;
    /// Without white space and line ends at both ends.
    StringReturner getTrimmedString() const;

    /// Whether the text begins with, ends with or contains the other, compared by code points.
    /// False for null.
    bool hasPrefix(const String* other) const { return other && hasPrefix(other->view()); }
    bool hasPrefix(std::string_view utf8) const { return mText.starts_with(utf8); }
    bool hasSuffix(const String* other) const { return other && hasSuffix(other->view()); }
    bool hasSuffix(std::string_view utf8) const { return mText.ends_with(utf8); }
    bool contains(const String* other) const { return other && contains(other->view()); }
    bool contains(std::string_view utf8) const { return mText.find(utf8) != std::string::npos; }
    /// Where `word` first stands in the text; if it is to be a `wholeWord`, where a word of the
    /// text begins and one ends with it. Canonically equivalent characters are the same, and a
    /// letter does not stand where it carries a diacritic, unless that is overlooked. None for
    /// null and for an empty word.
    std::optional<TextRange> findWord(const String* word, CompareOptions options,
                                      bool wholeWord) const;

    /// The decimal number at the start of the text, behind white space, the nearest if 64 bits do
    /// not hold it. 0 if there is none, and for a text of more than 31 bytes.
    long long toLongLong() const;
    /// The same for a text that may be null, which is 0.
    static long long toLongLong(const String* string) { return string ? string->toLongLong() : 0; }

    /// The text as a C string, which lives until the current pool drains.
    virtual const char* toCString() const;
    /// The text in UTF-8 with a final zero.
    DataReturner toCStringData() const;
    /// The text in UTF-8.
    DataReturner getData() const;
    /// The text in an encoding; null if that has no form for all of its characters.
    DataReturner getData(StringEncoding encoding) const;

    std::size_t getHash() const override;
    /// The hash of a string of this text.
    static std::size_t hashOf(std::string_view utf8);
    /// Whether `other` is a string of the same code points.
    bool isEqual(const PFRefCounted* other) const override;
    StringReturner toString() const override;

    /// The text as UTF-8. Valid as long as the string and, of a `MutableString`, until it changes.
    std::string_view view() const { return mText; }
    const std::string& utf8() const { return mText; }
    /// The same for a text that may be null, which is empty.
    static std::string_view view(const String* string) {
        return string ? string->view() : std::string_view();
    }

 protected:
    explicit String(std::string utf8) : mText(std::move(utf8)) {}

    std::string mText;
};

/// The text of an object's `toString`, which the current pool owns; null for null, and
/// "BAD_OBJECT(%p)" for a pointer that cannot be one.
String* ToString(const PFRefCounted* object);
String* ToString(const RefCounted* object);
/// The same as a reference, which needs no pool.
StringReturner ToStringUnpooled(const PFRefCounted* object);
StringReturner ToStringUnpooled(const RefCounted* object);
/// The number in decimal, which the current pool owns.
String* ToString(std::signed_integral auto number) {
    return String::stringWithFormat("%lli", number);
}
String* ToString(std::unsigned_integral auto number) {
    return String::stringWithFormat("%llu", number);
}

}  // namespace Foundation
