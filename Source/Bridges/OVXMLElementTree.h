#pragma once

#include "Foundation/Ref.h"
#include "Utilities/XMLElement.h"

#include <Orvane/OVXMLElement.h>

#include <memory>
#include <optional>
#include <vector>

/// What an `OVXMLElement` keeps. It may go where there is no pool.
class OVXMLElement::Tree {
 public:
    explicit Tree(Orvane::XMLElement* element) : mElement(element) {}
    ~Tree();
    Tree(const Tree&) = delete;
    Tree& operator=(const Tree&) = delete;

    Orvane::XMLElement* get() const { return mElement.get(); }

 private:
    Foundation::Ref<Orvane::XMLElement> mElement;
};

namespace Orvane {

/// The first element of that local name below another, in whatever namespace; null if there is
/// none.
Foundation::Ref<XMLElement> firstChild(const XMLElement& element, std::string_view name);
/// That of a feed's document which speaks of the feed, if its root does not.
inline Foundation::Ref<XMLElement> channelOf(const XMLElement& root) {
    return firstChild(root, "channel");
}

/// The public form of an element; none for null.
std::optional<OVXMLElement> publicElement(XMLElement* element);
/// That of all; null is an empty list.
std::vector<OVXMLElement> publicElements(const XMLElement::Elements* elements);
/// Those of the element's children that are in a namespace or, for null, outside of the element's
/// own.
std::vector<OVXMLElement> extensionsOf(const XMLElement& element,
                                       const std::optional<std::string>& uri);

}  // namespace Orvane
