#pragma once

#include "Foundation/ArrayOf.h"
#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/DateFormatter.h"
#include "Foundation/URL.h"
#include "Utilities/XMLNode.h"

#include <cstdint>
#include <string>
#include <vector>

namespace Orvane {

/// An element of a tree of XML. Names may have a prefix; a namespace is the URI that it stands for.
class XMLElement : public XMLNode {
 public:
    using Children = Foundation::ArrayOf<XMLNode>;
    using Elements = Foundation::ArrayOf<XMLElement>;
    template <class T>
    using Returner = Foundation::Returner<T>;
    using StringReturner = Foundation::StringReturner;

    static constexpr const char* kXHTMLNamespace = "http://www.w3.org/1999/xhtml";

    /// A new element, alone, in a namespace or, for null or an empty one, in none. Throws
    /// `AssertionFailure` without a name.
    static Returner<XMLElement> element(TextArgument name, TextArgument uri = nullptr);

    /// The root of a document. What is no XML is read with tolerance: missing ends, unknown
    /// references and the like are mended, and if `allowHTML`, pages of HTML are read as XHTML.
    /// Null for null and, with a warning, for what can't be read even so. External entities are
    /// never opened.
    static Returner<XMLElement> ov_elementWithData(const Foundation::Data* data, bool allowHTML);
    /// The same for a fragment of XHTML: its one `div`, or a `div` around all of it. Throws
    /// `AssertionFailure` for null.
    static Returner<XMLElement> ov_XHTMLElementWithData(const Foundation::Data* data);
    /// HTML, of any quality, as XHTML: its `html` element. Null, with the reason, if there is none.
    static Returner<XMLElement> elementWithHTML(const Foundation::Data* data,
                                                std::string* error = nullptr);

    /// The element as XML, indented where that adds to no text. Complete in itself: namespaces
    /// that the elements above declare are declared here.
    Foundation::DataReturner ov_asData() const;
    /// The same as a document with an XML declaration.
    StringReturner ov_asDocumentString() const;

    /// The name as it stands, with its prefix.
    StringReturner getName() const;
    StringReturner getLocalName() const;
    /// The URI that the name resolves to; null for none.
    StringReturner ov_namespace() const;
    /// Whether both are equal, null being equal to null.
    bool ov_hasName(TextArgument localName, TextArgument uri) const;

    /// The value of an attribute, by its name with the prefix; null if there is none.
    StringReturner getAttribute(TextArgument name) const;
    /// The names of all attributes with their prefixes, in their order.
    std::vector<std::string> getAttributeNames() const;
    /// Null removes the attribute.
    void setAttribute(TextArgument name, TextArgument value);

    Returner<Children> getChildren() const;
    Returner<Elements> getElements() const;
    Returner<Elements> getElements(TextArgument localName, TextArgument uri) const;
    std::size_t getChildCount() const;

    /// Adds a copy of a node, with what is below it, at the end, and gives the copy. Null for null.
    Returner<XMLNode> addChild(const XMLNode* node);
    /// Adds a text at the end. Characters that XML can't hold are left out.
    void addText(TextArgument text);

    /// Adds a new, empty element at the end. Its name resolves as names do here: without a prefix,
    /// to the default namespace. Throws `AssertionFailure` without a name.
    Returner<XMLElement> ov_addChildWithName(TextArgument name);
    /// The same with a text. Null, and nothing added, if that is null or empty.
    Returner<XMLElement> ov_addChildWithName(TextArgument name, TextArgument stringValue);
    /// The same with a date in the default time zone, formatted as `strftime` does, in English.
    /// Null, and nothing added, without a date.
    Returner<XMLElement> ov_addChildWithName(TextArgument name, const Foundation::Date* dateValue,
                                             TextArgument calendarFormat);
    Returner<XMLElement> ov_addChildWithName(TextArgument name, const Foundation::Date* dateValue,
                                             Foundation::DateFormatter* format);
    /// Adds a "link" with "rel", "type" (unless empty), "href" and "length" (unless 0). Null, and
    /// nothing added, without a URL.
    Returner<XMLElement> ov_addLinkTo(const Foundation::URL* url, TextArgument rel,
                                      TextArgument type, std::uint64_t length = 0);

    /// The elements below this one that have a namespace, which is `uri`.
    Returner<Elements> ov_childrenWithNamespace(TextArgument uri) const;
    /// The elements below this one that have a namespace, which is another than `uri`.
    Returner<Elements> ov_childrenWithoutNamespace(TextArgument uri) const;
    /// Detaches the children of a name.
    void ov_removeChildrenWithLocalName(TextArgument name, TextArgument uri);
    /// Given an attribute, detaches of these only those that lack it or, given a value, too, have
    /// that value in any case.
    void ov_removeChildrenWithLocalName(TextArgument name, TextArgument uri, TextArgument attribute,
                                        TextArgument value);

    static Returner<XMLElement> _wrapElement(XMLTree* tree, _xmlNode* node);

 private:
    XMLElement(XMLTree* tree, _xmlNode* node) : XMLNode(tree, node) {}

    static Returner<XMLElement> rootOf(XMLTree* tree);
    template <class Test>
    Returner<Elements> elementsThat(Test test) const;
};

}  // namespace Orvane
