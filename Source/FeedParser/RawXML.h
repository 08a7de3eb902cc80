#pragma once

#include "Foundation/Uncopyable.h"

#include <optional>
#include <string>
#include <vector>

struct _xmlBuffer;
struct _xmlNode;
struct _xmlNs;

namespace Orvane::FeedParser {

/// Writes elements of a document as XML that can stand alone: what is in scope and used of the
/// namespaces around an element is declared at the element itself. UTF-8.
class RawXML : Foundation::Uncopyable {
 public:
    RawXML();
    ~RawXML();

    /// The element with its tags. None if it cannot be written.
    std::optional<std::string> outer(_xmlNode* element);
    /// What stands between its tags; empty if nothing does.
    std::optional<std::string> inner(_xmlNode* element);

 private:
    bool append(_xmlNode* node, std::string& xml);
    bool appendTree(_xmlNode* node, std::string& xml);
    void collectNamespaces(_xmlNode* root);
    void need(_xmlNs* space, _xmlNode* user, const _xmlNode* root);

    _xmlBuffer* mBuffer;
    std::vector<_xmlNs*> mNeeded;  ///< of the present element, in the order of their use
};

}  // namespace Orvane::FeedParser
