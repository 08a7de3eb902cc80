#include "Utilities/XMLNode.h"

#include "Foundation/AssertionFailure.h"
#include "Utilities/XMLElement.h"

#include <libxml/entities.h>
#include <libxml/tree.h>

#include <functional>
#include <memory>
#include <new>

namespace Orvane {

using namespace Foundation;

namespace {

using Buffer = std::unique_ptr<xmlBuffer, void (*)(xmlBuffer*)>;

/// The node that comes after this one and what is below it, among those below `top`; null for none.
const xmlNode* nodeBehind(const xmlNode* node, const xmlNode* top) {
    while (node != top && !node->next) {
        node = node->parent;
    }
    return node == top ? nullptr : node->next;
}

/// libxml2 writes the URIs of namespaces as they stand, marks and all.
void escapeNamespaces(xmlNs* first) {
    for (xmlNs* ns = first; ns; ns = ns->next) {
        if (xmlView(ns->href).find_first_of("&<>") == std::string_view::npos) continue;
        xmlChar* escaped = xmlEncodeSpecialChars(nullptr, ns->href);
        if (!escaped) throw std::bad_alloc();
        xmlFree(const_cast<xmlChar*>(ns->href));
        ns->href = escaped;
    }
}

bool isText(const xmlNode* node) {
    return node->type == XML_TEXT_NODE || node->type == XML_CDATA_SECTION_NODE;
}

}  // namespace

std::string allowedInXML(std::string_view text) {
    std::string allowed;
    allowed.reserve(text.size());
    for (std::size_t i = 0; i < text.size(); ++i) {
        const char c = text[i];
        const bool isControl = c >= 0 && c < ' ' && c != '\t' && c != '\n' && c != '\r';
        if (isControl) continue;
        // U+FFFE and U+FFFF.
        if (text.substr(i, 2) == "\xEF\xBF" && (text.substr(i + 2, 1) >= "\xBE")) {
            i += 2;
            continue;
        }
        allowed += c;
    }
    return allowed;
}

Returner<XMLNode> XMLNode::text(TextArgument text) {
    if (text.isNull()) return nullptr;
    const Ref<XMLTree> tree = XMLTree::empty();
    xmlNode* node = xmlNewDocText(tree->document(), xmlChars(allowedInXML(text.view())));
    if (!node) throw std::bad_alloc();
    tree->keep(node);
    return wrap(tree, node);
}

Returner<XMLNode> XMLNode::ov_CDATAWithStringValue(TextArgument string) {
    OV_ASSERT_AS(!string.isNull(), "string");
    const Ref<XMLTree> tree = XMLTree::empty();
    const std::string text = allowedInXML(string.view());
    xmlNode* node =
        xmlNewCDataBlock(tree->document(), xmlChars(text), static_cast<int>(text.size()));
    if (!node) throw std::bad_alloc();
    tree->keep(node);
    return wrap(tree, node);
}

XMLNode::Kind XMLNode::getKind() const {
    switch (mNode->type) {
        case XML_ELEMENT_NODE:
            return Kind::Element;
        case XML_TEXT_NODE:
            return Kind::Text;
        case XML_CDATA_SECTION_NODE:
            return Kind::CDATA;
        default:
            return Kind::Other;
    }
}

StringReturner XMLNode::getStringValue() const {
    std::string text;
    for (const xmlNode* node = mNode; node;) {
        if (isText(node)) text += xmlView(node->content);
        const bool hasChildren = node->type == XML_ELEMENT_NODE && node->children;
        node = hasChildren ? node->children : nodeBehind(node, mNode);
    }
    return String::string(std::move(text));
}

Returner<XMLElement> XMLNode::getParent() const {
    const bool hasParent = mNode->parent && mNode->parent->type == XML_ELEMENT_NODE;
    return hasParent ? XMLElement::_wrapElement(mTree, mNode->parent) : nullptr;
}

void XMLNode::detach() {
    if (!mNode->parent) return;
    xmlUnlinkNode(mNode);
    mTree->keep(mNode);
    // What the elements above declared must now be declared here.
    if (mNode->type == XML_ELEMENT_NODE) xmlDOMWrapReconcileNamespaces(nullptr, mNode, 0);
}

Ref<XMLTree> XMLNode::copyToTree() const {
    const Ref<XMLTree> tree = XMLTree::empty();
    xmlNode* copy = xmlDocCopyNode(mNode, tree->document(), 1);
    if (!copy) throw std::bad_alloc();
    tree->setRoot(copy);
    for (const xmlNode* node = copy; node;) {
        if (node->type == XML_ELEMENT_NODE) escapeNamespaces(node->nsDef);
        const bool hasChildren = node->type == XML_ELEMENT_NODE && node->children;
        node = hasChildren ? node->children : nodeBehind(node, copy);
    }
    return tree;
}

Returner<XMLNode> XMLNode::wrap(XMLTree* tree, xmlNode* node) {
    if (!node) return nullptr;
    if (node->type == XML_ELEMENT_NODE) return XMLElement::_wrapElement(tree, node);
    return Returner<XMLNode>::adopted(new XMLNode(tree, node));
}

std::size_t XMLNode::getPFHashCode() const {
    return std::hash<const void*>()(mNode);
}

bool XMLNode::isEqual(const RefCounted* other) const {
    const auto* node = dynamic_cast<const XMLNode*>(other);
    return node && node->mNode == mNode;
}

StringReturner XMLNode::toString() const {
    const Ref<XMLTree> tree = copyToTree();
    const Buffer buffer(xmlBufferCreate(), xmlBufferFree);
    if (!buffer) throw std::bad_alloc();
    xmlNodeDump(buffer.get(), tree->document(), tree->document()->children, 0, 0);
    return String::string(std::string(xmlView(xmlBufferContent(buffer.get()))));
}

}  // namespace Orvane
