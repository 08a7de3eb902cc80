#pragma once

#include <Orvane/OVDocument.h>

#include <string>

namespace Commands::DocumentJSON {

/// A document as one JSON object on a line, with the name of its file. What the document has not
/// got is null. Times are ISO 8601 in UTC; binary contents are base64. Bytes that are no UTF-8
/// become U+FFFD.
std::string line(const std::string& file, const OVDocument& document);

}  // namespace Commands::DocumentJSON
