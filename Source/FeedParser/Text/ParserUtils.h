#pragma once

#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Foundation/TimeZone.h"

#include <cstddef>

namespace Orvane {

/// What mends the texts of feeds, which come escaped once, twice or not at all.
///
/// Texts are UTF-8 C strings, and null is no text. None of these throws or logs for bad input:
/// what it can't read stays as it is. Blanks are tab, LF, CR and space.
struct ParserUtils {
    /// Replaces the references of HTML ("&eacute;", "&#233;", "&#xE9;") by their characters, once:
    /// "&amp;amp;" becomes "&amp;". Only what is complete up to its ";" is one.
    ///
    /// Names: see `CharacterEntities`. Numbers have up to 5 decimal or 4 hexadecimal digits and are
    /// cut to 16 bits. Of those that are meant as Windows-1252 (130 to 140, 145 to 156 and 159,
    /// with exactly three decimal or two hexadecimal digits), the character is that of
    /// Windows-1252. What is no character of its own, a surrogate or the terminator, vanishes.
    ///
    /// With `trim`, the output loses the blanks of the input in front of its first character, and
    /// all at its end. Takes nothing from the heap. `dst` may be `src`, and must else have room for
    /// as much. Gives the length of the output.
    static std::size_t decodeEntities(const char* src, char* dst, bool trim);

    /// Takes out tags, from "<" to the next ">", and makes one space of each run of blanks. "<>",
    /// and a "<" with no ">" behind it, stay; so do references. Takes nothing from the heap. `dst`
    /// may be `src`, and must else have room for as much. Gives the length of the output.
    static std::size_t convertToPlainText(const char* src, char* dst);

    /// Plain text as HTML: characters with a meaning there are escaped, a run of spaces and tabs
    /// becomes one space, and a run of line ends, with the spaces and tabs behind it, "<br>" and a
    /// LF. Null for null and, with a warning, for what is no UTF-8.
    static Foundation::StringReturner convertToHTML(const char* text);
    /// The same for text up to its first zero byte or its end.
    static Foundation::StringReturner convertToHTML(const Foundation::Data* data);

    /// Moves `*text` behind the blanks at its start, and overwrites those at its end with zeros.
    static void trim(char** text);

    /// The bytes of a base64 text in a buffer that the caller must `free`, with a zero behind them.
    /// The text ends at its first "=". A buffer of null and length 0 for less than 4 characters.
    ///
    /// Characters that base64 doesn't have count as 0 each: a body with line breaks is noise.
    static void decodeBase64(const char* src, char** out, std::size_t* length);

    /// See `Foundation::parseDateText`. False for null, and if the text is no date.
    static bool parseDate(const char* text, Foundation::Ref<Foundation::Date>& date,
                          Foundation::Ref<Foundation::TimeZone>& timeZone);

    /// Writes what `convertToHTML` gives to `dst`, or only measures it where that is null. Gives
    /// the size with the final zero; 0, and nothing written, where the two are the same place.
    static std::size_t _convertToHTML(const char* src, char* dst);
};

}  // namespace Orvane
