#pragma once

#include "Foundation/Ref.h"
#include "Foundation/RefCounted.h"
#include "Foundation/String.h"
#include "Utilities/TextArgument.h"
#include "Utilities/XMLTree.h"

#include <string>

namespace Orvane {

class XMLElement;

/// A node of a tree of XML: an element, a text, or what else there is.
///
/// An object stands for a node and keeps the whole tree alive; two objects for the same node are
/// equal. A node that is detached goes on as a tree of its own.
class XMLNode : public Foundation::RefCounted {
 public:
    enum class Kind { Element, Text, CDATA, Other };

    /// A new text, alone. Characters that XML can't hold are left out. Null for null.
    static Foundation::Returner<XMLNode> text(TextArgument text);
    /// The same, written as a CDATA section. Throws `AssertionFailure` for null.
    static Foundation::Returner<XMLNode> ov_CDATAWithStringValue(TextArgument string);

    Kind getKind() const;
    /// The text of the node and of what is below it, without that of comments.
    Foundation::StringReturner getStringValue() const;
    /// Null for the top of a tree.
    Foundation::Returner<XMLElement> getParent() const;
    /// Takes the node, with what is below it, out of its parent. Elements keep their namespaces.
    void detach();

    std::size_t getPFHashCode() const override;
    bool isEqual(const RefCounted* other) const override;
    /// The node as XML.
    Foundation::StringReturner toString() const override;

    _xmlNode* _node() const { return mNode; }

 protected:
    XMLNode(XMLTree* tree, _xmlNode* node) : mTree(tree), mNode(node) {}
    XMLTree* tree() const { return mTree; }

    /// The object of a node's own class. Null for null.
    static Foundation::Returner<XMLNode> wrap(XMLTree* tree, _xmlNode* node);
    /// A tree whose root is a copy of the node, complete in itself, for writing.
    Foundation::Ref<XMLTree> copyToTree() const;

 private:
    Foundation::Ref<XMLTree> mTree;
    _xmlNode* mNode;
};

/// A text without the characters that XML 1.0 can't hold.
std::string allowedInXML(std::string_view text);

}  // namespace Orvane
