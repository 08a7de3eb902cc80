#pragma once

#include <Orvane/OVBase.h>
#include <Orvane/OVDate.h>
#include <Orvane/OVXMLElement.h>

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// Helpers for trees of XML: to make, to look through and to change them. An `OVXMLElement` stands
/// for a place in its tree, so a change shows in all elements of it. What feeds and entries give is
/// a tree of the caller's own each time, and changing it changes nothing in the database.
///
/// Texts are UTF-8; characters that XML cannot hold are left out of what is added. All of these
/// throw `OVException` for a text that is not UTF-8. The thread of the library's objects.

/// A text that stands in no tree.
struct OVXMLText {
    std::string string;    ///< what it says
    bool isCDATA = false;  ///< whether it is written as a CDATA section
};

// Making trees.

/// A new, empty element, alone, in a namespace or in none. A name may have a prefix. Throws
/// `OVException` for an empty name.
OV_EXPORT OVXMLElement ov_elementWithName(const std::string& name,
                                          const std::optional<std::string>& uri = {});
/// The root of a document: the same as `OVXMLElement::parse`.
inline std::optional<OVXMLElement> ov_elementWithData(std::string_view data, bool allowHTML) {
    return OVXMLElement::parse(data, allowHTML);
}
/// That of a piece of XHTML: its one `div`, or else a `div` around all of it. None if it cannot be
/// read, which is reported.
OV_EXPORT std::optional<OVXMLElement> ov_XHTMLElementWithData(std::string_view data);
/// A text that is written as a CDATA section.
OV_EXPORT OVXMLText ov_CDATAWithStringValue(const std::string& string);

// Looking at them.

/// The element as XML, complete in itself, indented where that adds to no text.
inline std::string ov_asData(const OVXMLElement& element) {
    return element.XMLString();
}
/// The same as a document: version 1.0, in UTF-8, with this root.
OV_EXPORT std::string ov_asDocumentString(const OVXMLElement& element);
/// The URI that the element's name resolves to; none if it is in no namespace.
inline std::optional<std::string> ov_namespace(const OVXMLElement& element) {
    return element.namespaceURI();
}
/// Whether local name and namespace are these, none being equal to none.
OV_EXPORT bool ov_hasName(const OVXMLElement& element, const std::optional<std::string>& localName,
                          const std::optional<std::string>& uri);
/// The elements right below that are in this namespace; nothing for none.
OV_EXPORT std::vector<OVXMLElement> ov_childrenWithNamespace(const OVXMLElement& element,
                                                             const std::optional<std::string>& uri);
/// Those that are in another one. Elements in no namespace are in neither of the two lists.
OV_EXPORT std::vector<OVXMLElement> ov_childrenWithoutNamespace(
    const OVXMLElement& element, const std::optional<std::string>& uri);

// Changing them.

/// Sets an attribute, by its name with its prefix; none removes it. Throws `OVException` for an
/// empty name.
OV_EXPORT void ov_setAttribute(OVXMLElement& element, const std::string& name,
                               const std::optional<std::string>& value);
/// Adds a text at the end, behind what is there.
OV_EXPORT void ov_addText(OVXMLElement& element, const OVXMLText& text);
/// Adds a copy of another element, with what is below it, and gives the copy.
OV_EXPORT OVXMLElement ov_addChild(OVXMLElement& element, const OVXMLElement& child);
/// Adds an empty element and gives it. Without a prefix its name is in the default namespace of the
/// place. Throws `OVException` for an empty name, as do the next two.
OV_EXPORT OVXMLElement ov_addChildWithName(OVXMLElement& element, const std::string& name);
/// The same with a text. Adds nothing, and gives none, if that is none or empty.
OV_EXPORT std::optional<OVXMLElement> ov_addChildWithName(
    OVXMLElement& element, const std::string& name, const std::optional<std::string>& stringValue);
/// The same with a date in the user's time zone, by a format of `strftime`, in English. Adds
/// nothing, and gives none, without a date.
OV_EXPORT std::optional<OVXMLElement> ov_addChildWithName(OVXMLElement& element,
                                                          const std::string& name,
                                                          const std::optional<OVDate>& dateValue,
                                                          const std::string& format);
/// Adds a "link" with the attributes "rel", "type" (unless it is empty), "href" and "length"
/// (unless it is 0; bytes). Adds nothing, and gives none, without a URL. Throws `OVException` for a
/// `url` that is no absolute URL.
OV_EXPORT std::optional<OVXMLElement> ov_addLinkTo(OVXMLElement& element,
                                                   const std::optional<std::string>& url,
                                                   const std::string& rel, const std::string& type,
                                                   std::uint64_t length = 0);
/// Takes all elements of a name out that stand right below this one.
OV_EXPORT void ov_removeChildrenWithLocalName(OVXMLElement& element, const std::string& name,
                                              const std::optional<std::string>& uri);
/// Given an attribute, takes of these only those out that lack it and, given a value, too, those
/// that have this value in any case.
OV_EXPORT void ov_removeChildrenWithLocalName(OVXMLElement& element, const std::string& name,
                                              const std::optional<std::string>& uri,
                                              const std::optional<std::string>& attribute,
                                              const std::optional<std::string>& value = {});
