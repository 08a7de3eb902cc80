#include <Orvane/OVXMLAdditions.h>

#include "Bridges/Barriers.h"
#include "Bridges/OVXMLElementTree.h"
#include "Bridges/PublicValues.h"

using namespace Foundation;
using namespace Orvane;

namespace {

using Text = std::optional<std::string>;
using Element = std::optional<OVXMLElement>;

XMLElement& treeOf(const OVXMLElement& element) {
    return *element._tree().get();
}

void requireName(const std::string& name, const char* function) {
    requireParameter(!name.empty(), function, "name");
}

}  // namespace

OVXMLElement ov_elementWithName(const std::string& name, const Text& uri) {
    requireName(name, "ov_elementWithName");
    return raising("ov_elementWithName", [&] {
        const Ref<XMLElement> element = XMLElement::element(stringOf(name), stringOf(uri));
        return *publicElement(element.get());
    });
}

Element ov_XHTMLElementWithData(std::string_view data) {
    return reporting("ov_XHTMLElementWithData", [&] {
        const Ref<Data> bytes = Data::data(data.data(), data.size());
        const Ref<XMLElement> element = XMLElement::ov_XHTMLElementWithData(bytes.get());
        return publicElement(element.get());
    });
}

OVXMLText ov_CDATAWithStringValue(const std::string& string) {
    return {string, true};
}

std::string ov_asDocumentString(const OVXMLElement& element) {
    return raising("ov_asDocumentString", [&] {
        const Ref<String> document = treeOf(element).ov_asDocumentString();
        return textOf(document.get()).value_or("");
    });
}

bool ov_hasName(const OVXMLElement& element, const Text& localName, const Text& uri) {
    return raising("ov_hasName",
                   [&] { return treeOf(element).ov_hasName(stringOf(localName), stringOf(uri)); });
}

std::vector<OVXMLElement> ov_childrenWithNamespace(const OVXMLElement& element, const Text& uri) {
    return reporting("ov_childrenWithNamespace", [&] {
        const Ref<XMLElement::Elements> found =
            treeOf(element).ov_childrenWithNamespace(stringOf(uri));
        return publicElements(found.get());
    });
}

std::vector<OVXMLElement> ov_childrenWithoutNamespace(const OVXMLElement& element,
                                                      const Text& uri) {
    return reporting("ov_childrenWithoutNamespace", [&] {
        const Ref<XMLElement::Elements> found =
            treeOf(element).ov_childrenWithoutNamespace(stringOf(uri));
        return publicElements(found.get());
    });
}

void ov_setAttribute(OVXMLElement& element, const std::string& name, const Text& value) {
    requireName(name, "ov_setAttribute");
    raising("ov_setAttribute",
            [&] { treeOf(element).setAttribute(stringOf(name), stringOf(value)); });
}

void ov_addText(OVXMLElement& element, const OVXMLText& text) {
    raising("ov_addText", [&] {
        const Ref<String> string = stringOf(text.string);
        if (!text.isCDATA) return treeOf(element).addText(string);
        const Ref<XMLNode> section = XMLNode::ov_CDATAWithStringValue(string);
        const Ref<XMLNode> added = treeOf(element).addChild(section.get());
    });
}

OVXMLElement ov_addChild(OVXMLElement& element, const OVXMLElement& child) {
    return raising("ov_addChild", [&] {
        const Ref<XMLNode> added = treeOf(element).addChild(&treeOf(child));
        return *publicElement(static_cast<XMLElement*>(added.get()));
    });
}

OVXMLElement ov_addChildWithName(OVXMLElement& element, const std::string& name) {
    requireName(name, "ov_addChildWithName");
    return raising("ov_addChildWithName", [&] {
        const Ref<XMLElement> child = treeOf(element).ov_addChildWithName(stringOf(name));
        return *publicElement(child.get());
    });
}

Element ov_addChildWithName(OVXMLElement& element, const std::string& name,
                            const Text& stringValue) {
    requireName(name, "ov_addChildWithName");
    return raising("ov_addChildWithName", [&] {
        const Ref<XMLElement> child =
            treeOf(element).ov_addChildWithName(stringOf(name), stringOf(stringValue));
        return publicElement(child.get());
    });
}

Element ov_addChildWithName(OVXMLElement& element, const std::string& name,
                            const std::optional<OVDate>& dateValue, const std::string& format) {
    requireName(name, "ov_addChildWithName");
    return raising("ov_addChildWithName", [&] {
        const Ref<Date> date = dateOf(dateValue);
        const Ref<XMLElement> child =
            treeOf(element).ov_addChildWithName(stringOf(name), date.get(), stringOf(format));
        return publicElement(child.get());
    });
}

Element ov_addLinkTo(OVXMLElement& element, const Text& url, const std::string& rel,
                     const std::string& type, std::uint64_t length) {
    return raising("ov_addLinkTo", [&] {
        const Ref<URL> target = urlOf(url);
        const Ref<XMLElement> link =
            treeOf(element).ov_addLinkTo(target.get(), stringOf(rel), stringOf(type), length);
        return publicElement(link.get());
    });
}

void ov_removeChildrenWithLocalName(OVXMLElement& element, const std::string& name,
                                    const Text& uri) {
    ov_removeChildrenWithLocalName(element, name, uri, {}, {});
}

void ov_removeChildrenWithLocalName(OVXMLElement& element, const std::string& name, const Text& uri,
                                    const Text& attribute, const Text& value) {
    raising("ov_removeChildrenWithLocalName", [&] {
        treeOf(element).ov_removeChildrenWithLocalName(stringOf(name), stringOf(uri),
                                                       stringOf(attribute), stringOf(value));
    });
}
