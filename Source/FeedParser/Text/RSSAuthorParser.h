#pragma once

#include "Foundation/Ref.h"
#include "Foundation/String.h"

#include <string>

namespace Orvane {

/// What an author line of RSS says: an address with the name in parentheses behind it, a name, in
/// quotes or not, with the address in angle brackets behind it, or a bare name.
struct RSSAuthorParser {
    Foundation::Ref<Foundation::String> name;   ///< null if none was found
    Foundation::Ref<Foundation::String> email;  ///< null if none was found

    /// Reads the text up to its first zero byte. Null gives neither.
    explicit RSSAuthorParser(const Foundation::String* text);

    /// Takes the blanks at both ends away: zero byte, tab, LF, VT, FF, CR and space.
    static void trim(std::string& text);

 private:
    void parseString(const char* text);
};

}  // namespace Orvane
