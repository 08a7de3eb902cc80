#include "Utilities/XMLDocumentReader.h"

#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/UTF8.h"
#include "Utilities/XMLNode.h"

#include <glib.h>
#include <libxml/HTMLparser.h>
#include <libxml/SAX2.h>
#include <libxml/parser.h>
#include <libxml/tree.h>

#include <algorithm>
#include <climits>
#include <memory>
#include <new>

namespace Orvane {

using namespace Foundation;

namespace {

constexpr std::string_view kXHTML = "http://www.w3.org/1999/xhtml";
/// A document of so many faults is given up: there are some that never come to an end.
constexpr int kMostFaults = 10000;

using Context = std::unique_ptr<xmlParserCtxt, void (*)(xmlParserCtxt*)>;

/// What was wrong with a document.
struct Faults {
    int count = 0;
    std::string first;
};

void noteFault(void* user, xmlError* fault) {
    callGuarded(__PRETTY_FUNCTION__, [&] {
        auto* context = static_cast<xmlParserCtxt*>(user);
        if (!context || !context->_private) return;
        auto& faults = *static_cast<Faults*>(context->_private);
        if (faults.count == 0 && fault && fault->message) {
            faults.first = fault->message;
            faults.first.erase(faults.first.find_last_not_of(" \n") + 1);
            faults.first += " (line " + std::to_string(fault->line) + ")";
        }
        if (++faults.count != kMostFaults) return;
        gLogParser.log("An XML document has %d faults and is given up", kMostFaults);
        xmlStopParser(context);
    });
}

/// Takes in no entity but those whose text stands in the document itself.
void declareInternalEntity(void* user, const xmlChar* name, int type, const xmlChar* publicID,
                           const xmlChar* systemID, xmlChar* content) {
    if (type == XML_INTERNAL_GENERAL_ENTITY) {
        xmlSAX2EntityDecl(user, name, type, publicID, systemID, content);
    }
}

/// Makes a tree of what a parser made; null without a root.
Ref<XMLTree> treeOf(xmlDoc* document) {
    if (!document) return nullptr;
    const Ref<XMLTree> tree = new XMLTree(document);
    return tree->root() ? tree : nullptr;
}

void prepare(xmlParserCtxt* context, Faults& faults) {
    if (!context) throw std::bad_alloc();
    context->_private = &faults;
    context->sax->serror = noteFault;
    context->sax->entityDecl = declareInternalEntity;
}

Ref<XMLTree> readXML(std::string_view bytes, int options, std::string& error) {
    Faults faults;
    const Context context(xmlNewParserCtxt(), xmlFreeParserCtxt);
    prepare(context.get(), faults);
    options |= XML_PARSE_NONET | XML_PARSE_NOENT | XML_PARSE_NODICT | XML_PARSE_NOERROR |
               XML_PARSE_NOWARNING;
    Ref<XMLTree> tree = treeOf(xmlCtxtReadMemory(
        context.get(), bytes.data(), static_cast<int>(bytes.size()), nullptr, nullptr, options));
    if (!tree) error = faults.first.empty() ? "No root element" : faults.first;
    return tree;
}

/// The node after this one and what is below it, among those below `root`; null for none.
xmlNode* nodeBehind(xmlNode* node, const xmlNode* root) {
    while (node != root && !node->next) {
        node = node->parent;
    }
    return node == root ? nullptr : node->next;
}

/// The node after this one, with those below it; null for none.
xmlNode* nextNode(xmlNode* node, const xmlNode* root) {
    const bool hasChildren = node->type == XML_ELEMENT_NODE && node->children;
    return hasChildren ? node->children : nodeBehind(node, root);
}

/// Whether a node could not be read again if it were written.
bool isUnreadable(const xmlNode* node) {
    const std::string_view content = xmlView(node->content);
    if (node->type == XML_COMMENT_NODE) {
        return content.find("--") != std::string_view::npos || content.ends_with('-');
    }
    return node->type == XML_PI_NODE &&
           xmlStrcasecmp(node->name, reinterpret_cast<const xmlChar*>("xml")) == 0;
}

void removeUnreadableAttributes(xmlNode* element) {
    for (xmlAttr* attribute = element->properties; attribute;) {
        xmlAttr* next = attribute->next;
        if (xmlValidateName(attribute->name, 0) != 0) xmlRemoveProp(attribute);
        attribute = next;
    }
}

/// Takes what is no XML out of a tree that a tolerant parser made: HTML has comments and
/// names of its own, and a document in a document brings its declaration along.
void removeUnreadable(xmlNode* root) {
    for (xmlNode* node = root; node;) {
        xmlNode* next = nextNode(node, root);
        if (node->type == XML_ELEMENT_NODE) removeUnreadableAttributes(node);
        if (isUnreadable(node)) {
            xmlUnlinkNode(node);
            xmlFreeNode(node);
        }
        node = next;
    }
}

/// Makes the elements of HTML, which know no namespaces, those of XHTML.
void putIntoXHTML(xmlNode* root) {
    const std::string uri(kXHTML);
    xmlNs* xhtml = nullptr;
    for (xmlNode* node = root; node; node = nextNode(node, root)) {
        if (node->type != XML_ELEMENT_NODE) continue;
        xmlUnsetProp(node, reinterpret_cast<const xmlChar*>("xmlns"));
        if (!xhtml) xhtml = xmlNewNs(root, xmlChars(uri), nullptr);
        xmlSetNs(node, xhtml);
    }
}

/// Whether a document is in UTF-16 or UTF-32, by its first two bytes.
bool isWide(std::string_view bytes) {
    using namespace std::string_view_literals;
    const std::string_view start = bytes.substr(0, 2);
    return start == "\xFE\xFF"sv || start == "\xFF\xFE"sv || start.find('\0') != start.npos;
}

Ref<XMLTree> readHTML(std::string_view page, std::string& error) {
    const std::string bytes = isWide(page) ? std::string(page) : allowedInXML(page);
    Faults faults;
    const Context context(htmlNewParserCtxt(), htmlFreeParserCtxt);
    prepare(context.get(), faults);
    constexpr int kOptions =
        HTML_PARSE_RECOVER | HTML_PARSE_NONET | HTML_PARSE_NOERROR | HTML_PARSE_NOWARNING;
    const char* encoding = UTF8::isValid(bytes) ? "UTF-8" : nullptr;
    const Ref<XMLTree> html = treeOf(htmlCtxtReadMemory(
        context.get(), bytes.data(), static_cast<int>(bytes.size()), nullptr, encoding, kOptions));
    if (!html) {
        error = faults.first.empty() ? "No root element" : faults.first;
        return nullptr;
    }
    // A document of XML, so that it is written as such.
    const Ref<XMLTree> tree = XMLTree::empty();
    xmlNode* root = xmlDocCopyNode(html->root(), tree->document(), 1);
    if (!root) throw std::bad_alloc();
    tree->setRoot(root);
    putIntoXHTML(root);
    removeUnreadable(root);
    return tree;
}

bool isPage(const XMLTree& tree) {
    return xmlStrcasecmp(tree.root()->name, reinterpret_cast<const xmlChar*>("html")) == 0;
}

constexpr bool isNameCharacter(char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == '_' ||
           c == '-' || c == '.' || c == ':' || (c & 0x80) != 0;
}

/// What a reference, without "&" and ";", is to be in XML; "&amp;" with the rest for what is none.
std::string mendReference(std::string_view name, bool hasOwnEntities) {
    constexpr std::string_view kKnown[] = {"amp", "lt", "gt", "quot", "apos"};
    const std::string whole = "&" + std::string(name) + ";";
    const bool isKnown = std::find(std::begin(kKnown), std::end(kKnown), name) != std::end(kKnown);
    if (isKnown || hasOwnEntities) return whole;
    const htmlEntityDesc* entity = htmlEntityLookup(xmlChars(std::string(name)));
    return entity ? "&#" + std::to_string(entity->value) + ";" : "&amp;" + whole.substr(1);
}

/// Whether the text behind "&#" is a number and its ";".
bool isNumber(std::string_view text) {
    const bool isHex = text.starts_with('x');
    const std::string_view digits = isHex ? "0123456789abcdefABCDEF" : "0123456789";
    if (isHex) text.remove_prefix(1);
    const std::size_t end = text.find_first_not_of(digits);
    return end != 0 && end != std::string_view::npos && text[end] == ';';
}

/// Whether a document names an encoding that is not UTF-8.
bool hasOtherEncoding(std::string_view bytes) {
    if (!bytes.starts_with("<?xml")) return false;
    const std::string_view declaration = bytes.substr(0, bytes.find("?>"));
    const std::size_t name = declaration.find("encoding");
    if (name == std::string_view::npos) return false;
    const std::size_t start = declaration.find_first_of("'\"", name);
    if (start == std::string_view::npos) return false;
    const std::string encoding(declaration.substr(start + 1, 5));
    return xmlStrcasecmp(xmlChars(encoding), reinterpret_cast<const xmlChar*>("utf-8")) != 0;
}

/// UTF-8, without zeros, in which each byte that is none is read as Latin-1, what most of them are.
std::string mendUTF8(std::string_view bytes) {
    std::string mended;
    while (!bytes.empty()) {
        const char* validEnd = nullptr;
        g_utf8_validate_len(bytes.data(), bytes.size(), &validEnd);
        mended.append(bytes.data(), validEnd);
        bytes.remove_prefix(static_cast<std::size_t>(validEnd - bytes.data()));
        if (bytes.empty()) break;
        const auto byte = static_cast<unsigned char>(bytes.front());
        mended += static_cast<char>(0xC0 | byte >> 6);
        mended += static_cast<char>(0x80 | (byte & 0x3F));
        bytes.remove_prefix(1);
    }
    return mended;
}

/// A document with what can be mended before it is parsed.
std::string mendBytes(std::string_view bytes) {
    if (isWide(bytes)) return std::string(bytes);
    const std::string allowed = allowedInXML(bytes);
    if (!hasOtherEncoding(bytes)) return mendReferences(mendUTF8(allowed));
    // Among escapes, "&" may be half of a character.
    const bool hasEscapes = bytes.find('\x1B') != bytes.npos;
    return hasEscapes ? std::string(bytes) : mendReferences(allowed);
}

/// How long the CDATA section or comment at the start of a text is; 0 if there is none.
std::size_t opaqueLength(std::string_view text) {
    const std::pair<std::string_view, std::string_view> kinds[] = {{"<![CDATA[", "]]>"},
                                                                   {"<!--", "-->"}};
    for (const auto& [start, end] : kinds) {
        if (!text.starts_with(start)) continue;
        const std::size_t found = text.find(end, start.size());
        return found == std::string_view::npos ? text.size() : found + end.size();
    }
    return 0;
}

}  // namespace

std::string mendReferences(std::string_view bytes) {
    const bool hasOwnEntities = bytes.find("<!ENTITY") != std::string_view::npos;
    std::string mended;
    while (!bytes.empty()) {
        const std::size_t stop = std::min(bytes.find_first_of("&<"), bytes.size());
        mended += bytes.substr(0, stop);
        bytes.remove_prefix(stop);
        if (bytes.empty()) break;
        std::size_t taken = 1;
        if (bytes.front() == '<') {
            taken = std::max<std::size_t>(opaqueLength(bytes), 1);
            mended += bytes.substr(0, taken);
        } else {
            const auto* end = std::find_if_not(bytes.begin() + 1, bytes.end(), isNameCharacter);
            const std::string_view name(bytes.begin() + 1, end);
            const bool isNamed = !name.empty() && end != bytes.end() && *end == ';';
            const bool isNumbered = bytes.starts_with("&#") && isNumber(bytes.substr(2));
            if (isNamed) taken = name.size() + 2;
            if (isNamed) mended += mendReference(name, hasOwnEntities);
            if (!isNamed) mended += isNumbered ? "&" : "&amp;";
        }
        bytes.remove_prefix(taken);
    }
    return mended;
}

Ref<XMLTree> readXMLDocument(std::string_view bytes, XMLTolerance tolerance, std::string& error) {
    if (bytes.size() > INT_MAX) {
        error = "The document is too large";
        return nullptr;
    }
    if (bytes.empty()) {
        error = "The document is empty";
        return nullptr;
    }
    if (tolerance == XMLTolerance::None) return readXML(bytes, 0, error);
    if (tolerance == XMLTolerance::HTML) return readHTML(bytes, error);
    const Ref<XMLTree> tree = readXML(mendBytes(bytes), XML_PARSE_RECOVER, error);
    if (tree) removeUnreadable(tree->root());
    const bool allowHTML = tolerance == XMLTolerance::XMLOrHTML;
    if (allowHTML && (!tree || isPage(*tree))) return readHTML(bytes, error);
    return tree;
}

}  // namespace Orvane
