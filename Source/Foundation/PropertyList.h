#pragma once

#include "Foundation/Bytes.h"
#include "Foundation/PFRefCounted.h"
#include "Foundation/Returner.h"

#include <string>

namespace Foundation {

/// Trees of values as XML, the form of preferences and of settings files: `String`, `Number`,
/// `Data`, `Date`, arrays, and dictionaries with `String` keys.
///
/// The XML is UTF-8 with one `plist` element around one value. Dates are whole seconds of the
/// years 1 to 9999, in GMT. Trees are at most `kMaxDepth` values deep.
struct PropertyList {
    static constexpr std::size_t kMaxDepth = 512;

    /// The value that `xml` holds. Arrays are `MutableArrayOf<PFRefCounted>`, dictionaries
    /// `MutableDictionary`; of entries with equal keys the last counts. The start of 2001 reads as
    /// null, as everywhere: it leaves its key out of a dictionary.
    ///
    /// Null for what is not a property list, and then `error`, if given, gets a text that says
    /// what is wrong and where; otherwise it is emptied. Entities that a document type defines are
    /// not expanded and count as wrong, so that the result is never larger than the text.
    static Returner<PFRefCounted> read(Bytes xml, std::string* error = nullptr);

    /// The XML of a tree. The entries of dictionaries keep their order.
    ///
    /// Null, with `error` saying why, if the tree holds something else than the above, null, a date
    /// outside those years, or a text with a character that XML cannot hold, which is U+FFFE,
    /// U+FFFF and each below U+0020 but tab, line feed and carriage return: to write another in its
    /// place would change the value in silence.
    static DataReturner write(const PFRefCounted* value, std::string* error = nullptr);
};

}  // namespace Foundation
