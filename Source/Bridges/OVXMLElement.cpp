#include <Orvane/OVXMLElement.h>

#include "Bridges/Barriers.h"
#include "Bridges/OVXMLElementTree.h"
#include "Bridges/PublicValues.h"
#include "Foundation/Guard.h"

using namespace Foundation;
using namespace Orvane;

OVXMLElement::Tree::~Tree() {
    callGuarded("OVXMLElement::Tree::~Tree()", [this] { mElement = nullptr; });
}

namespace Orvane {

Ref<XMLElement> firstChild(const XMLElement& element, std::string_view name) {
    const Ref<XMLElement::Elements> children = element.getElements();
    for (XMLElement* child : *children) {
        const Ref<String> local = child->getLocalName();
        if (local->view() == name) return child;
    }
    return nullptr;
}

std::optional<OVXMLElement> publicElement(XMLElement* element) {
    if (!element) return std::nullopt;
    return OVXMLElement(std::make_shared<const OVXMLElement::Tree>(element));
}

std::vector<OVXMLElement> publicElements(const XMLElement::Elements* elements) {
    std::vector<OVXMLElement> all;
    if (!elements) return all;
    for (XMLElement* element : *elements) {
        all.push_back(*publicElement(element));
    }
    return all;
}

std::vector<OVXMLElement> extensionsOf(const XMLElement& element,
                                       const std::optional<std::string>& uri) {
    const Ref<String> own = element.ov_namespace();
    const Ref<XMLElement::Elements> found =
        uri ? element.ov_childrenWithNamespace(*uri) : element.ov_childrenWithoutNamespace(own);
    return publicElements(found.get());
}

}  // namespace Orvane

std::optional<OVXMLElement> OVXMLElement::parse(std::string_view document, bool allowHTML) {
    return reporting("+[OVXMLElement parse:allowHTML:]", [&] {
        const Ref<Data> data = Data::data(document.data(), document.size());
        const Ref<XMLElement> root = XMLElement::ov_elementWithData(data.get(), allowHTML);
        return publicElement(root.get());
    });
}

std::string OVXMLElement::name() const {
    return raising("-[OVXMLElement name]", [&] {
        const Ref<String> text = mTree->get()->getName();
        return textOf(text.get()).value_or("");
    });
}

std::string OVXMLElement::localName() const {
    return raising("-[OVXMLElement localName]", [&] {
        const Ref<String> text = mTree->get()->getLocalName();
        return textOf(text.get()).value_or("");
    });
}

std::optional<std::string> OVXMLElement::namespaceURI() const {
    return raising("-[OVXMLElement namespaceURI]", [&] {
        const Ref<String> text = mTree->get()->ov_namespace();
        return textOf(text.get());
    });
}

std::optional<std::string> OVXMLElement::attribute(std::string_view name) const {
    return raising("-[OVXMLElement attribute:]", [&] {
        const Ref<String> text = mTree->get()->getAttribute(name);
        return textOf(text.get());
    });
}

std::vector<std::string> OVXMLElement::attributeNames() const {
    return raising("-[OVXMLElement attributeNames]",
                   [&] { return mTree->get()->getAttributeNames(); });
}

std::string OVXMLElement::stringValue() const {
    return raising("-[OVXMLElement stringValue]", [&] {
        const Ref<String> text = mTree->get()->getStringValue();
        return textOf(text.get()).value_or("");
    });
}

std::vector<OVXMLElement> OVXMLElement::children() const {
    return raising("-[OVXMLElement children]", [&] {
        const Ref<XMLElement::Elements> elements = mTree->get()->getElements();
        return publicElements(elements.get());
    });
}

std::string OVXMLElement::XMLString() const {
    return raising("-[OVXMLElement XMLString]", [&] {
        const Ref<Data> data = mTree->get()->ov_asData();
        return bytesOf(data.get()).value_or("");
    });
}
