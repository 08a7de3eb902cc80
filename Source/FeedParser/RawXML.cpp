#include "FeedParser/RawXML.h"

#include "Foundation/AssertionFailure.h"

#include <libxml/parserInternals.h>
#include <libxml/tree.h>
#include <algorithm>
#include <cstring>
#include <string_view>

namespace Orvane::FeedParser {

namespace {

const char* asText(const xmlChar* text) {
    return reinterpret_cast<const char*>(text);
}

bool isDeclaredAt(const xmlNode* element, const xmlNs* space) {
    for (const xmlNs* declared = element->nsDef; declared; declared = declared->next) {
        if (declared == space) return true;
    }
    return false;
}

/// The node behind `node` in document order, within the tree of `root`; null behind the last.
/// References to entities are not entered.
xmlNode* next(xmlNode* node, const xmlNode* root) {
    if (node->type == XML_ELEMENT_NODE && node->children) return node->children;
    while (node != root) {
        if (node->next) return node->next;
        node = node->parent;
    }
    return nullptr;
}

/// Text as libxml2 writes it in UTF-8.
void appendEscaped(std::string_view text, std::string& xml) {
    std::size_t done = 0;
    for (std::size_t i = text.find_first_of("<>&\r"); i != std::string_view::npos;
         i = text.find_first_of("<>&\r", done)) {
        xml.append(text, done, i - done);
        switch (text[i]) {
            case '<':
                xml += "&lt;";
                break;
            case '>':
                xml += "&gt;";
                break;
            case '&':
                xml += "&amp;";
                break;
            default:
                xml += "&#13;";
                break;
        }
        done = i + 1;
    }
    xml.append(text, done);
}

/// While it lives, an element declares more namespaces than its own.
class DeclaredAt : Foundation::Uncopyable {
 public:
    DeclaredAt(xmlNode* element, const std::vector<xmlNs*>& spaces) {
        for (const xmlNs* space : spaces) {
            mDeclarations.push_back(*space);
            mDeclarations.back().next = nullptr;
        }
        for (std::size_t i = 1; i < mDeclarations.size(); ++i) {
            mDeclarations[i - 1].next = &mDeclarations[i];
        }
        if (mDeclarations.empty()) return;
        mEnd = &element->nsDef;
        while (*mEnd) {
            mEnd = &(*mEnd)->next;
        }
        *mEnd = mDeclarations.data();
    }
    ~DeclaredAt() {
        if (mEnd) *mEnd = nullptr;
    }

 private:
    std::vector<xmlNs> mDeclarations;
    xmlNs** mEnd = nullptr;
};

}  // namespace

RawXML::RawXML() : mBuffer(xmlBufferCreate()) {
    OV_ASSERT(mBuffer);
}

RawXML::~RawXML() {
    xmlBufferFree(mBuffer);
}

std::optional<std::string> RawXML::outer(xmlNodePtr element) {
    std::optional<std::string> xml(std::in_place);
    if (!append(element, *xml)) xml.reset();
    return xml;
}

std::optional<std::string> RawXML::inner(xmlNodePtr element) {
    std::optional<std::string> xml(std::in_place);
    for (xmlNodePtr child = element->children; child; child = child->next) {
        if (!append(child, *xml)) return std::nullopt;
    }
    return xml;
}

bool RawXML::append(xmlNodePtr node, std::string& xml) {
    // Most of what is written is a text alone, for which a buffer of libxml2's is a detour.
    if (node->type == XML_TEXT_NODE && node->content && node->name == xmlStringText) {
        appendEscaped(asText(node->content), xml);
        return true;
    }
    return appendTree(node, xml);
}

bool RawXML::appendTree(xmlNodePtr node, std::string& xml) {
    mNeeded.clear();
    if (node->type == XML_ELEMENT_NODE) collectNamespaces(node);
    xmlBufferEmpty(mBuffer);
    const DeclaredAt declared(node, mNeeded);
    if (xmlNodeDump(mBuffer, node->doc, node, 0, 0) < 0) return false;
    xml.append(asText(xmlBufferContent(mBuffer)),
               static_cast<std::size_t>(xmlBufferLength(mBuffer)));
    return true;
}

void RawXML::collectNamespaces(xmlNodePtr root) {
    for (xmlNodePtr node = root; node; node = next(node, root)) {
        if (node->type != XML_ELEMENT_NODE) continue;
        need(node->ns, node, root);
        for (const xmlAttr* attribute = node->properties; attribute; attribute = attribute->next) {
            need(attribute->ns, node, root);
        }
    }
}

void RawXML::need(xmlNsPtr space, xmlNodePtr user, const xmlNode* root) {
    if (!space || std::find(mNeeded.begin(), mNeeded.end(), space) != mNeeded.end()) return;
    if (space->prefix && std::strcmp(asText(space->prefix), "xml") == 0) return;
    for (const xmlNode* node = user;; node = node->parent) {
        if (isDeclaredAt(node, space)) return;
        if (node == root) break;
    }
    mNeeded.push_back(space);
}

}  // namespace Orvane::FeedParser
