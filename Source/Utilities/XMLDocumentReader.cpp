#include "Utilities/XMLDocumentReader.h"

#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/UTF8.h"
#include "Utilities/XMLMending.h"
#include "Utilities/XMLNode.h"

#include <libxml/HTMLparser.h>
#include <libxml/SAX2.h>
#include <libxml/parser.h>
#include <libxml/tree.h>

#include <memory>
#include <new>
#include <set>
#include <string>

namespace Orvane {

using namespace Foundation;

namespace {

constexpr std::string_view kXHTML = "http://www.w3.org/1999/xhtml";
/// A document of so many faults is given up: there are some that never come to an end.
constexpr int kMostFaults = 10000;
/// What is mended may grow to five times as much, and libxml2 counts in 32 bits.
constexpr std::size_t kMostBytes = 256u << 20;

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

/// Leaves a node only what XML can hold.
void mendContent(xmlNode* node) {
    const std::string_view content = xmlView(node->content);
    const std::string allowed = allowedInXML(content);
    if (allowed != content) xmlNodeSetContent(node, xmlChars(allowed));
}

/// Whether a name can be read where namespaces are known: it has one colon at most.
bool isName(const xmlChar* name) {
    return xmlValidateQName(name, 0) == 0;
}

std::string writtenName(const xmlAttr* attribute) {
    const std::string name(xmlView(attribute->name));
    if (!attribute->ns || !attribute->ns->prefix) return name;
    return std::string(xmlView(attribute->ns->prefix)) + ":" + name;
}

/// Leaves an element only attributes of names that XML has, each name once, and with values that
/// XML can hold.
void mendAttributes(xmlNode* element) {
    std::set<std::string> names;
    for (xmlAttr* attribute = element->properties; attribute;) {
        xmlAttr* next = attribute->next;
        for (xmlNode* text = attribute->children; text; text = text->next) {
            mendContent(text);
        }
        const bool once = names.insert(writtenName(attribute)).second;
        if (!once || !isName(attribute->name)) xmlRemoveProp(attribute);
        attribute = next;
    }
}

/// Gives an element a name that XML has, and such attributes.
void mendElement(xmlNode* element) {
    if (!isName(element->name)) {
        const std::string name = "_" + std::string(xmlView(element->name));
        xmlNodeSetName(element, xmlChars(isName(xmlChars(name)) ? name : "_"));
    }
    mendAttributes(element);
}

/// Takes what is no XML out of a tree that a tolerant parser made: HTML has comments, names and
/// characters of its own, and a document in a document brings its declaration along.
void removeUnreadable(xmlNode* root) {
    for (xmlNode* node = root; node;) {
        xmlNode* next = nextNode(node, root);
        if (node->type == XML_ELEMENT_NODE) {
            mendElement(node);
        } else {
            mendContent(node);
        }
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

/// The tree of XHTML that libxml2's tree of HTML stands for: of XML, so that it is written as such.
Ref<XMLTree> makeXHTML(const XMLTree& html) {
    const Ref<XMLTree> tree = XMLTree::empty();
    xmlNode* root = xmlDocCopyNode(html.root(), tree->document(), 1);
    if (!root) throw std::bad_alloc();
    tree->setRoot(root);
    putIntoXHTML(root);
    removeUnreadable(root);
    return tree;
}

/// Reads HTML in an encoding, which libxml2 looks for in the page if it is null.
Ref<XMLTree> parseHTML(const std::string& page, const char* encoding, std::string& error) {
    Faults faults;
    const Context context(htmlNewParserCtxt(), htmlFreeParserCtxt);
    prepare(context.get(), faults);
    constexpr int kOptions =
        HTML_PARSE_RECOVER | HTML_PARSE_NONET | HTML_PARSE_NOERROR | HTML_PARSE_NOWARNING;
    const Ref<XMLTree> html = treeOf(htmlCtxtReadMemory(
        context.get(), page.data(), static_cast<int>(page.size()), nullptr, encoding, kOptions));
    if (html) return makeXHTML(*html);
    error = faults.first.empty() ? "No root element" : faults.first;
    return nullptr;
}

/// Whether all that a tree holds is UTF-8.
bool isUTF8(const XMLTree& tree) {
    const std::unique_ptr<xmlBuffer, void (*)(xmlBuffer*)> text(xmlBufferCreate(), xmlBufferFree);
    if (!text) throw std::bad_alloc();
    xmlNodeDump(text.get(), tree.document(), tree.root(), 0, 0);
    return UTF8::isValid(xmlView(xmlBufferContent(text.get())));
}

Ref<XMLTree> readHTML(std::string_view bytes, std::string& error) {
    const std::string page = isWideXML(bytes) ? std::string(bytes) : allowedInXML(bytes);
    if (UTF8::isValid(page)) return parseHTML(page, "UTF-8", error);
    // Where libxml2 finds no encoding that fits, it leaves halves of characters in the tree.
    const Ref<XMLTree> tree = parseHTML(page, nullptr, error);
    return tree && isUTF8(*tree) ? tree : parseHTML(mendUTF8(allowedInXML(page)), "UTF-8", error);
}

bool isPage(const XMLTree& tree) {
    return xmlStrcasecmp(tree.root()->name, reinterpret_cast<const xmlChar*>("html")) == 0;
}

}  // namespace

Ref<XMLTree> readXMLDocument(std::string_view bytes, XMLTolerance tolerance, std::string& error) {
    if (bytes.size() > kMostBytes) {
        error = "The document is too large";
        return nullptr;
    }
    if (bytes.empty()) {
        error = "The document is empty";
        return nullptr;
    }
    if (tolerance == XMLTolerance::None) return readXML(bytes, 0, error);
    if (tolerance == XMLTolerance::HTML) return readHTML(bytes, error);
    const Ref<XMLTree> tree = readXML(mendXML(bytes), XML_PARSE_RECOVER, error);
    if (tree) removeUnreadable(tree->root());
    const bool allowHTML = tolerance == XMLTolerance::XMLOrHTML;
    if (allowHTML && (!tree || isPage(*tree))) return readHTML(bytes, error);
    return tree;
}

}  // namespace Orvane
