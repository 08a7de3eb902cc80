#include "FeedParser/NamespaceClass.h"

#include "FeedParser/NameTrie.h"

namespace Orvane::FeedParser {

namespace {

/// How often "http://" may stand in front of a name.
struct Times {
    int least;
    int most;
};
constexpr Times kOptional{0, 1};
constexpr Times kOnceOrTwice{1, 2};

/// Whether any text may follow a name.
enum class Behind : bool { Nothing, Anything };

struct NamespaceSpec {
    const char* text;  ///< without "http://" and a final "/"
    NamespaceClass uri;
    Times http;
    Behind behind = Behind::Nothing;
};

constexpr NamespaceSpec kNamespaceSpecs[] = {
    {"", BlankUri, kOptional},
    {"purl.org/atom/ns#", FeedUri, kOnceOrTwice, Behind::Anything},
    {"purl.org/dc/elements/1.0", DublinCoreUri, kOptional},
    {"purl.org/dc/elements/1.1", DublinCoreUri, kOptional},
    {"purl.org/dc/elements/1.2", DublinCoreUri, kOptional},
    {"purl.org/dc/elements/1.3", DublinCoreUri, kOptional},
    {"purl.org/dc/elements/1.4", DublinCoreUri, kOptional},
    {"purl.org/dc/elements/1.5", DublinCoreUri, kOptional},
    {"purl.org/dc/elements/1.6", DublinCoreUri, kOptional},
    {"purl.org/dc/elements/1.7", DublinCoreUri, kOptional},
    {"purl.org/dc/elements/1.8", DublinCoreUri, kOptional},
    {"purl.org/dc/elements/1.9", DublinCoreUri, kOptional},
    {"purl.org/rss/1.0", FeedUri, kOptional},
    {"purl.org/rss/1.0/modules/content", ContentUri, kOptional},
    {"purl.org/rss/1.1", FeedUri, kOptional},
    {"www.w3.org/1999/02/22-rdf-syntax-ns", RDFUri, kOptional},
    {"www.w3.org/1999/02/22-rdf-syntax-ns#", RDFUri, kOptional},
    {"www.w3.org/1999/xhtml", HTMLUri, kOnceOrTwice},
    {"www.w3.org/2005/atom", FeedUri, kOnceOrTwice},
    {"www.w3.org/TR/html", HTMLUri, kOnceOrTwice, Behind::Anything},
    {"xmlns.com/foaf/0.0", FOAFUri, kOptional},
    {"xmlns.com/foaf/0.1", FOAFUri, kOptional},
    {"xmlns.com/foaf/0.2", FOAFUri, kOptional},
    {"xmlns.com/foaf/0.3", FOAFUri, kOptional},
    {"xmlns.com/foaf/0.4", FOAFUri, kOptional},
    {"xmlns.com/foaf/0.5", FOAFUri, kOptional},
    {"xmlns.com/foaf/0.6", FOAFUri, kOptional},
    {"xmlns.com/foaf/0.7", FOAFUri, kOptional},
    {"xmlns.com/foaf/0.8", FOAFUri, kOptional},
    {"xmlns.com/foaf/0.9", FOAFUri, kOptional},
};

constexpr std::size_t kNamespaceNodes = 256;
constexpr NameTrie<kNamespaceNodes> kNamespaces(kNamespaceSpecs);

constexpr const char* kNamespaceClassNames[] = {
    "BlankUri",      "UnknownUri", "HTMLUri",    "FeedUri",
    "DublinCoreUri", "RDFUri",     "ContentUri", "FOAFUri",
};

/// Whether "http://", in any case, begins at `text`, which then moves behind it.
bool skipHTTP(const char*& text) {
    const char* c = text;
    for (const char* expected = "http://"; *expected; ++expected, ++c) {
        const char folded = *c >= 'A' && *c <= 'Z' ? static_cast<char>(*c | 0x20) : *c;
        if (folded != *expected) return false;
    }
    text = c;
    return true;
}

const NamespaceSpec* specAt(decltype(kNamespaces)::Node node) {
    const int place = kNamespaces.value(node);
    return place == kNamespaces.kNone ? nullptr : &kNamespaceSpecs[place];
}

/// The name that the text is, but for one "/" and blanks behind it; null for none.
const NamespaceSpec* findNamespace(const char* text) {
    auto node = kNamespaces.kRoot;
    const NamespaceSpec* spec = specAt(node);
    while (!spec || spec->behind == Behind::Nothing) {
        const bool isSlash = *text == '/';
        node = kNamespaces.step(node, *text);
        const NamespaceSpec* next = node == kNamespaces.kRoot ? nullptr : specAt(node);
        // A "/" may end one name and lead on to a longer one.
        const bool mayEnd = spec && *skipNameBlanks(text + isSlash) == '\0';
        if (mayEnd && !next) return spec;
        if (node == kNamespaces.kRoot) return nullptr;
        spec = next;
        ++text;
    }
    return spec;
}

}  // namespace

NamespaceClass sStringToUri(const char* uri) {
    if (!uri) return BlankUri;
    uri = skipNameBlanks(uri);
    int times = 0;
    while (times < 2 && skipHTTP(uri)) {
        ++times;
    }
    const NamespaceSpec* spec = findNamespace(uri);
    const bool fits = spec && spec->http.least <= times && times <= spec->http.most;
    return fits ? spec->uri : UnknownUri;
}

const char* namespaceClassName(NamespaceClass uri) {
    return kNamespaceClassNames[uri];
}

}  // namespace Orvane::FeedParser
