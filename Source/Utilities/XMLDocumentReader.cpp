#include "Utilities/XMLDocumentReader.h"

#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/UTF8.h"

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

/// Makes the elements of HTML, which know no namespaces, those of XHTML.
void putIntoXHTML(xmlNode* root) {
    const std::string uri(kXHTML);
    xmlNs* xhtml = nullptr;
    for (xmlNode* node = root; node;) {
        if (node->type == XML_ELEMENT_NODE) {
            xmlUnsetProp(node, reinterpret_cast<const xmlChar*>("xmlns"));
            if (!xhtml) xhtml = xmlNewNs(root, xmlChars(uri), nullptr);
            xmlSetNs(node, xhtml);
        }
        if (node->type == XML_ELEMENT_NODE && node->children) {
            node = node->children;
            continue;
        }
        while (node != root && !node->next) {
            node = node->parent;
        }
        node = node == root ? nullptr : node->next;
    }
}

Ref<XMLTree> readHTML(std::string_view bytes, std::string& error) {
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
    // Where there are zeros the text is not in an encoding that has ASCII's "&".
    const bool canBeMended = bytes.find('\0') == std::string_view::npos;
    const Ref<XMLTree> tree = canBeMended ? readXML(mendReferences(bytes), XML_PARSE_RECOVER, error)
                                          : readXML(bytes, XML_PARSE_RECOVER, error);
    const bool allowHTML = tolerance == XMLTolerance::XMLOrHTML;
    if (allowHTML && (!tree || isPage(*tree))) return readHTML(bytes, error);
    return tree;
}

}  // namespace Orvane
