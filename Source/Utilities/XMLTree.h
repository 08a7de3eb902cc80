#pragma once

#include "Foundation/Ref.h"
#include "Foundation/RefCounted.h"

#include <string>
#include <string_view>
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

/// A text for libxml2. Valid as long as `text`.
inline const unsigned char* xmlChars(const std::string& text) {
    return reinterpret_cast<const unsigned char*>(text.c_str());
}
/// A text of libxml2, which may be null: an empty one then.
inline std::string_view xmlView(const unsigned char* text) {
    return text ? std::string_view(reinterpret_cast<const char*>(text)) : std::string_view();
}

}  // namespace Orvane
