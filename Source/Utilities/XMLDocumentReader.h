#pragma once

#include "Foundation/Ref.h"
#include "Utilities/XMLTree.h"

#include <string>
#include <string_view>

namespace Orvane {

/// What is done about a document that is no XML.
enum class XMLTolerance {
    None,       ///< it is refused
    XML,        ///< what can be mended is mended
    XMLOrHTML,  ///< the same, but what looks like a page of HTML is read as that
    HTML,       ///< it is read as HTML, which refuses next to nothing
};

/// The tree of a document. Null, with the first thing that is wrong with it, if it is refused or
/// has no root.
///
/// HTML becomes XHTML. Entities that the document itself defines are replaced by what they stand
/// for, as far as libxml2's bounds go; external ones are not known, and nothing is ever opened.
Foundation::Ref<XMLTree> readXMLDocument(std::string_view bytes, XMLTolerance tolerance,
                                         std::string& error);

}  // namespace Orvane
