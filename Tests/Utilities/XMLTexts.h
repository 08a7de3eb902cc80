#pragma once

#include "Foundation/Data.h"
#include "Utilities/XMLElement.h"

#include <string>

/// The root of a document.
inline Foundation::Ref<Orvane::XMLElement> parse(const std::string& xml, bool allowHTML = false) {
    const Foundation::Ref<Foundation::Data> data = Foundation::Data::adopt(xml);
    return Orvane::XMLElement::ov_elementWithData(data, allowHTML);
}

/// A node on one line.
inline std::string xmlOf(const Orvane::XMLNode& node) {
    return Foundation::Ref<Foundation::String>(node.toString())->utf8();
}

inline Foundation::Ref<Orvane::XMLElement> firstElement(const Orvane::XMLElement& element) {
    const Foundation::Ref<Orvane::XMLElement::Elements> elements = element.getElements();
    return elements->first();
}
