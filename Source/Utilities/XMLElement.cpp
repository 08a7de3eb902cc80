#include "Utilities/XMLElement.h"

#include "Foundation/AssertionFailure.h"

#include <libxml/tree.h>

#include <memory>
#include <new>

namespace Orvane {

using namespace Foundation;

namespace {

struct XMLMemory {
    void operator()(xmlChar* text) const { xmlFree(text); }
};
using XMLText = std::unique_ptr<xmlChar, XMLMemory>;

/// A name's two halves; no prefix is an empty one.
struct SplitName {
    explicit SplitName(std::string_view name) {
        const std::size_t colon = name.find(':');
        if (colon != std::string_view::npos) prefix = name.substr(0, colon);
        local = name.substr(colon == std::string_view::npos ? 0 : colon + 1);
    }
    std::string prefix;
    std::string local;
};

xmlNs* namespaceOf(xmlNode* node, const std::string& prefix) {
    return xmlSearchNs(node->doc, node, prefix.empty() ? nullptr : xmlChars(prefix));
}

/// A new node of a name that resolves as at `place`. A prefix that stands for nothing there stays
/// a part of the name.
xmlNode* newNode(xmlNode* place, const std::string& name) {
    const SplitName split(name);
    xmlNs* ns = namespaceOf(place, split.prefix);
    xmlNode* node = xmlNewDocNode(place->doc, ns, xmlChars(ns ? split.local : name), nullptr);
    if (!node) throw std::bad_alloc();
    return node;
}

/// The attribute of a name; null if there is none. One that only a DTD gives is none.
xmlAttr* findAttribute(xmlNode* node, const std::string& name) {
    const SplitName split(name);
    const xmlNs* ns = split.prefix.empty() ? nullptr : namespaceOf(node, split.prefix);
    xmlAttr* found = ns ? xmlHasNsProp(node, xmlChars(split.local), ns->href)
                        : xmlHasNsProp(node, xmlChars(name), nullptr);
    return found && found->type == XML_ATTRIBUTE_NODE ? found : nullptr;
}

StringReturner textOf(std::string_view text) {
    return String::string(std::string(text));
}

}  // namespace

Returner<XMLElement> XMLElement::_wrapElement(XMLTree* tree, xmlNode* node) {
    return Returner<XMLElement>::adopted(new XMLElement(tree, node));
}

Returner<XMLElement> XMLElement::rootOf(XMLTree* tree) {
    return tree->root() ? _wrapElement(tree, tree->root()) : nullptr;
}

Returner<XMLElement> XMLElement::element(TextArgument name, TextArgument uri) {
    OV_ASSERT_AS(!name.isEmpty(), "name");
    const SplitName split(name.view());
    const Ref<XMLTree> tree = XMLTree::empty();
    xmlNode* node = xmlNewDocNode(tree->document(), nullptr, xmlChars(split.local), nullptr);
    if (!node) throw std::bad_alloc();
    tree->setRoot(node);
    if (!uri.isEmpty()) {
        const std::string href(uri.view());
        const xmlChar* prefix = split.prefix.empty() ? nullptr : xmlChars(split.prefix);
        xmlSetNs(node, xmlNewNs(node, xmlChars(href), prefix));
    }
    return _wrapElement(tree, node);
}

StringReturner XMLElement::getName() const {
    const xmlNs* ns = _node()->ns;
    std::string name(xmlView(ns ? ns->prefix : nullptr));
    if (!name.empty()) name += ':';
    return textOf(name.append(xmlView(_node()->name)));
}

StringReturner XMLElement::getLocalName() const {
    const std::string_view name = xmlView(_node()->name);
    return textOf(name.substr(name.find(':') + 1));
}

StringReturner XMLElement::ov_namespace() const {
    const xmlNs* ns = _node()->ns;
    const std::string_view uri = xmlView(ns ? ns->href : nullptr);
    return uri.empty() ? nullptr : textOf(uri);
}

bool XMLElement::ov_hasName(TextArgument localName, TextArgument uri) const {
    const Ref<String> ownURI = ov_namespace();
    const Ref<String> ownName = getLocalName();
    return uri == TextArgument(ownURI) && localName == TextArgument(ownName);
}

StringReturner XMLElement::getAttribute(TextArgument name) const {
    const xmlAttr* attribute = findAttribute(_node(), std::string(name.view()));
    if (!attribute) return nullptr;
    const XMLText value(xmlNodeListGetString(_node()->doc, attribute->children, 1));
    return textOf(xmlView(value.get()));
}

std::vector<std::string> XMLElement::getAttributeNames() const {
    std::vector<std::string> names;
    for (const xmlAttr* each = _node()->properties; each; each = each->next) {
        const bool hasPrefix = each->ns && each->ns->prefix;
        std::string name = hasPrefix ? std::string(xmlView(each->ns->prefix)) + ':' : std::string();
        name += xmlView(each->name);
        names.push_back(std::move(name));
    }
    return names;
}

void XMLElement::setAttribute(TextArgument name, TextArgument value) {
    OV_ASSERT_AS(!name.isEmpty(), "name");
    const std::string text(name.view());
    if (value.isNull()) {
        xmlAttr* attribute = findAttribute(_node(), text);
        if (attribute) xmlRemoveProp(attribute);
        return;
    }
    const SplitName split(text);
    xmlNs* ns = split.prefix.empty() ? nullptr : namespaceOf(_node(), split.prefix);
    const std::string allowed = allowedInXML(value.view());
    xmlSetNsProp(_node(), ns, xmlChars(ns ? split.local : text), xmlChars(allowed));
}

Returner<XMLElement::Children> XMLElement::getChildren() const {
    const Ref<MutableArrayOf<XMLNode>> children = MutableArrayOf<XMLNode>::array();
    for (xmlNode* child = _node()->children; child; child = child->next) {
        children->add(wrap(tree(), child));
    }
    return Returner<Children>::retained(children);
}

std::size_t XMLElement::getChildCount() const {
    std::size_t count = 0;
    for (const xmlNode* child = _node()->children; child; child = child->next) {
        ++count;
    }
    return count;
}

template <class Test>
Returner<XMLElement::Elements> XMLElement::elementsThat(Test test) const {
    const Ref<MutableArrayOf<XMLElement>> elements = MutableArrayOf<XMLElement>::array();
    for (xmlNode* child = _node()->children; child; child = child->next) {
        if (child->type != XML_ELEMENT_NODE) continue;
        const Ref<XMLElement> element = _wrapElement(tree(), child);
        if (test(*element)) elements->add(element);
    }
    return Returner<Elements>::retained(elements);
}

Returner<XMLElement::Elements> XMLElement::getElements() const {
    return elementsThat([](const XMLElement&) { return true; });
}

Returner<XMLElement::Elements> XMLElement::getElements(TextArgument localName,
                                                       TextArgument uri) const {
    return elementsThat(
        [&](const XMLElement& element) { return element.ov_hasName(localName, uri); });
}

Returner<XMLElement::Elements> XMLElement::ov_childrenWithNamespace(TextArgument uri) const {
    return elementsThat([&](const XMLElement& element) {
        const Ref<String> own = element.ov_namespace();
        return own && uri == TextArgument(own);
    });
}

Returner<XMLElement::Elements> XMLElement::ov_childrenWithoutNamespace(TextArgument uri) const {
    return elementsThat([&](const XMLElement& element) {
        const Ref<String> own = element.ov_namespace();
        return own && !(uri == TextArgument(own));
    });
}

Returner<XMLNode> XMLElement::addChild(const XMLNode* node) {
    if (!node) return nullptr;
    xmlNode* copy = xmlDocCopyNode(node->_node(), _node()->doc, 1);
    if (!copy) throw std::bad_alloc();
    // A text joins the one that stands last: then that is what was added.
    xmlNode* added = xmlAddChild(_node(), copy);
    if (added->type == XML_ELEMENT_NODE) xmlDOMWrapReconcileNamespaces(nullptr, added, 1);
    return wrap(tree(), added);
}

void XMLElement::addText(TextArgument text) {
    const std::string allowed = allowedInXML(text.view());
    if (!allowed.empty()) xmlAddChild(_node(), xmlNewDocText(_node()->doc, xmlChars(allowed)));
}

Returner<XMLElement> XMLElement::ov_addChildWithName(TextArgument name) {
    OV_ASSERT_AS(!name.isEmpty(), "name");
    xmlNode* child = newNode(_node(), std::string(name.view()));
    return _wrapElement(tree(), xmlAddChild(_node(), child));
}

}  // namespace Orvane
