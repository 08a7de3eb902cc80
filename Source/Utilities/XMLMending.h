#pragma once

#include <string>
#include <string_view>

namespace Orvane {

/// A document without what stops a parser and can be mended ahead of it: characters that XML can't
/// hold, references that it does not know, and bytes that are not in the document's encoding.
std::string mendXML(std::string_view bytes);

/// A document in which every reference is one that XML knows: those to characters that HTML has
/// names for are replaced by numbers, and an "&" that begins no reference by "&amp;". Where the
/// document defines entities, names are left to it.
std::string mendReferences(std::string_view bytes);

/// UTF-8, without zeros, in which each byte that is none is read as Latin-1, what most of them are.
std::string mendUTF8(std::string_view bytes);

/// Whether a document is in UTF-16 or UTF-32, by its first two bytes.
bool isWideXML(std::string_view bytes);

}  // namespace Orvane
