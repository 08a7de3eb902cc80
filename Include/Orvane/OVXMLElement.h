#pragma once

#include <Orvane/OVBase.h>

#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// An element of XML, to look at: a value that keeps the tree which it is of. Texts are UTF-8.
///
/// The thread of the library's objects, see `OVObject`.
class OVXMLElement {
 public:
    /// The library's own form of it.
    class Tree;

    /// The root of a document; with `allowHTML` also of what is HTML and no XML. What can be mended
    /// is mended; none for what cannot be read even so. Nothing that the document names is opened.
    OV_EXPORT static std::optional<OVXMLElement> parse(std::string_view document,
                                                       bool allowHTML = false);

    /// The name with its prefix.
    OV_EXPORT std::string name() const;
    OV_EXPORT std::string localName() const;
    /// The URI that the name resolves to; none if the element is in no namespace.
    OV_EXPORT std::optional<std::string> namespaceURI() const;
    /// The value of an attribute, by its name with its prefix; none if it is not there.
    OV_EXPORT std::optional<std::string> attribute(std::string_view name) const;
    /// The names of all attributes with their prefixes, in their order.
    OV_EXPORT std::vector<std::string> attributeNames() const;
    /// The text of the element and of all that is below it.
    OV_EXPORT std::string stringValue() const;
    /// The elements right below this one, in their order.
    OV_EXPORT std::vector<OVXMLElement> children() const;
    /// The element as XML, complete in itself.
    OV_EXPORT std::string XMLString() const;

    /// For the library.
    explicit OVXMLElement(std::shared_ptr<const Tree> tree) : mTree(std::move(tree)) {}
    const Tree& _tree() const { return *mTree; }

 private:
    std::shared_ptr<const Tree> mTree;
};
