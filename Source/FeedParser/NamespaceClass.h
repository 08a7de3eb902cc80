#pragma once

#include <cstdint>

namespace Orvane::FeedParser {

/// The vocabularies that a feed's names come from.
enum NamespaceClass : std::uint8_t {
    BlankUri,       ///< no namespace
    UnknownUri,     ///< any other
    HTMLUri,        ///< XHTML and the W3C's pages on HTML
    FeedUri,        ///< Atom 0.3 and 1.0, RSS 1.0 and 1.1
    DublinCoreUri,  ///< the element set, versions 1.0 to 1.9
    RDFUri,
    ContentUri,  ///< the content module of RSS 1.0
    FOAFUri,     ///< versions 0.0 to 0.9
};

/// The vocabulary that a namespace stands for. Case does not count, nor do blanks (space, tab, CR,
/// LF) at both ends or one "/" at the end; "http://" may be missing or doubled where feeds are
/// known to do so. Null is `BlankUri`. Takes one step for each character, and nothing from the
/// heap.
NamespaceClass sStringToUri(const char* uri);

/// The class's own name, for logs: "FeedUri". Lives for ever.
const char* namespaceClassName(NamespaceClass uri);

}  // namespace Orvane::FeedParser
