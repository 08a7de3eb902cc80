#pragma once

#include "Foundation/Uncopyable.h"

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

struct _xmlAttr;
struct _xmlNode;
struct _xmlNs;

namespace Orvane::FeedParser {

/// Writes elements of a document as XML that can stand alone: what is used of the namespaces that
/// are declared around an element is declared at the element itself, behind its own declarations.
///
/// UTF-8, and to the byte what libxml2 writes of a copy of the element. That itself takes twice as
/// long, and copying as long again.
class RawXML : Foundation::Uncopyable {
 public:
    /// The element with its tags. None if it cannot be written.
    std::optional<std::string> outer(_xmlNode* element);
    /// What stands between its tags; empty if nothing does.
    std::optional<std::string> inner(_xmlNode* element);

 private:
    void append(_xmlNode* tree);
    bool appendNode(const _xmlNode* node);
    bool appendElement(const _xmlNode* element);
    bool appendStartTag(const _xmlNode* element);
    void appendName(const _xmlNs* space, const unsigned char* name);
    bool appendDeclaration(const _xmlNs* space);
    bool appendAttribute(const _xmlAttr* attribute);
    bool appendByLibrary(_xmlNode* tree);
    void need(const _xmlNs* space, const _xmlNode* user);
    bool declareNeeded();

    std::string mXML;
    bool mFailed = false;
    const _xmlNode* mRoot = nullptr;     ///< of the tree that is being written
    std::size_t mDeclarationsEnd = 0;    ///< in its start tag
    std::vector<const _xmlNs*> mNeeded;  ///< by it, in the order of their use
};

}  // namespace Orvane::FeedParser
