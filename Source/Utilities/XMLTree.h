#pragma once

#include "Foundation/Ref.h"
#include "Foundation/RefCounted.h"
#include "Utilities/XMLText.h"

#include <vector>

struct _xmlDoc;
struct _xmlNode;

namespace Orvane {

/// Owns a document of libxml2, and what was detached from it: every node lives as long as the tree.
class XMLTree : public Foundation::RefCounted {
 public:
    /// Takes the document over.
    explicit XMLTree(_xmlDoc* document) : mDocument(document) {}
    /// A tree without a root.
    static Foundation::Ref<XMLTree> empty();
    ~XMLTree() override;

    _xmlDoc* document() const { return mDocument; }
    /// The root element; null if there is none.
    _xmlNode* root() const;
    /// Makes the node, which stands nowhere yet, the root of this tree, which has none.
    void setRoot(_xmlNode* node);
    /// Keeps a node that stands nowhere any more.
    void keep(_xmlNode* detached) { mDetached.push_back(detached); }

 private:
    _xmlDoc* mDocument;
    std::vector<_xmlNode*> mDetached;
};

}  // namespace Orvane
