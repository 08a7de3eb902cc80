#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace Foundation {

/// A way to write text as bytes.
class StringEncoding {
 public:
    static const StringEncoding kUTF8;
    /// Read in the order that a byte order mark tells, without one in big-endian order, and written
    /// with a mark.
    static const StringEncoding kUTF16;
    static const StringEncoding kUTF16BE;
    static const StringEncoding kUTF16LE;
    static const StringEncoding kLatin1;
    static const StringEncoding kWindows1252;
    static const StringEncoding kMacRoman;
    static const StringEncoding kASCII;

    /// The encoding of a MIME, IANA or other usual name, in any case. None if it is not known.
    static std::optional<StringEncoding> named(const char* name);

    /// The MIME name where there is one. Lives as long as the process.
    const char* getName() const { return mName; }
    bool operator==(const StringEncoding& other) const;

    /// The text of bytes in this encoding, as UTF-8, without a byte order mark at its start. None
    /// if they are not all text of this encoding.
    std::optional<std::string> decode(std::string_view bytes) const;
    /// The same, with U+FFFD in the place of what is no text.
    std::string decodeLeniently(std::string_view bytes) const;
    /// The bytes of a UTF-8 text in this encoding. None if it has no form for all characters.
    std::optional<std::string> encode(std::string_view utf8) const;

 private:
    constexpr explicit StringEncoding(const char* name) : mName(name) {}

    const char* mName;
};

inline constexpr StringEncoding StringEncoding::kUTF8("UTF-8");
inline constexpr StringEncoding StringEncoding::kUTF16("UTF-16");
inline constexpr StringEncoding StringEncoding::kUTF16BE("UTF-16BE");
inline constexpr StringEncoding StringEncoding::kUTF16LE("UTF-16LE");
inline constexpr StringEncoding StringEncoding::kLatin1("ISO-8859-1");
inline constexpr StringEncoding StringEncoding::kWindows1252("windows-1252");
inline constexpr StringEncoding StringEncoding::kMacRoman("macintosh");
inline constexpr StringEncoding StringEncoding::kASCII("US-ASCII");

}  // namespace Foundation
