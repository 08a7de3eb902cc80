#pragma once

#include <Orvane/OVDocument.h>

#include <string>

namespace Commands::DocumentText {

/// A document for people, in lines. What the document has not got is left out. No text of the
/// document's can control a terminal: line breaks become blanks, and other control characters go.
std::string text(const std::string& file, const OVDocument& document);

}  // namespace Commands::DocumentText
