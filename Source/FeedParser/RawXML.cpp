#include "FeedParser/RawXML.h"

#include "Utilities/XMLText.h"

#include <libxml/parserInternals.h>
#include <libxml/tree.h>
#include <algorithm>
#include <cstring>
#include <memory>

namespace Orvane::FeedParser {

namespace {

// What does not stand for itself.
constexpr const char* kTextSpecials = "<>&\r";
constexpr const char* kAttributeSpecials = "<>&\r\"\n\t";

const char* escapeOf(char special) {
    switch (special) {
        case '<':
            return "&lt;";
        case '>':
            return "&gt;";
        case '&':
            return "&amp;";
        case '\r':
            return "&#13;";
        case '"':
            return "&quot;";
        case '\n':
            return "&#10;";
        default:
            return "&#9;";
    }
}

void appendEscaped(const xmlChar* content, const char* specials, std::string& xml) {
    if (!content) return;
    const char* text = xmlCString(content);
    while (true) {
        const std::size_t plain = std::strcspn(text, specials);
        xml.append(text, plain);
        text += plain;
        if (!*text) return;
        xml += escapeOf(*text++);
    }
}

bool isASCII(const xmlChar* text) {
    for (; text && *text; ++text) {
        if (*text >= 0x80) return false;
    }
    return true;
}

/// Whether libxml2 writes the document by the rules of XHTML.
bool isXHTML(const xmlDoc* document) {
    const xmlDtd* type = xmlGetIntSubset(document);
    return type && xmlIsXHTML(type->SystemID, type->ExternalID) == 1;
}

bool isDeclaredAt(const xmlNode* element, const xmlNs* space) {
    for (const xmlNs* declared = element->nsDef; declared; declared = declared->next) {
        if (declared == space) return true;
    }
    return false;
}

}  // namespace

std::optional<std::string> RawXML::outer(xmlNodePtr element) {
    mXML.clear();
    mFailed = false;
    append(element);
    return mFailed ? std::nullopt : std::optional(mXML);
}

std::optional<std::string> RawXML::inner(xmlNodePtr element) {
    mXML.clear();
    mFailed = false;
    for (xmlNodePtr child = element->children; child; child = child->next) {
        append(child);
    }
    return mFailed ? std::nullopt : std::optional(mXML);
}

void RawXML::append(xmlNodePtr tree) {
    const std::size_t begin = mXML.size();
    mRoot = tree;
    mNeeded.clear();
    if (!isXHTML(tree->doc) && appendNode(tree) && declareNeeded()) return;
    mXML.resize(begin);
    if (!appendByLibrary(tree)) mFailed = true;
}

/// False for what is left to libxml2.
bool RawXML::appendNode(const xmlNode* node) {
    switch (node->type) {
        case XML_ELEMENT_NODE:
            return appendElement(node);
        case XML_TEXT_NODE:
            appendEscaped(node->content, kTextSpecials, mXML);
            return node->name == xmlStringText;
        case XML_ENTITY_REF_NODE:
            ((mXML += '&') += xmlCString(node->name)) += ';';
            return true;
        case XML_COMMENT_NODE:
            ((mXML += "<!--") += node->content ? xmlCString(node->content) : "") += "-->";
            return true;
        default:
            return false;
    }
}

bool RawXML::appendElement(const xmlNode* element) {
    if (!appendStartTag(element)) return false;
    if (!element->children) {
        mXML += "/>";
        return true;
    }
    mXML += '>';
    for (const xmlNode* child = element->children; child; child = child->next) {
        if (!appendNode(child)) return false;
    }
    mXML += "</";
    appendName(element->ns, element->name);
    mXML += '>';
    return true;
}

bool RawXML::appendStartTag(const xmlNode* element) {
    need(element->ns, element);
    mXML += '<';
    appendName(element->ns, element->name);
    for (const xmlNs* space = element->nsDef; space; space = space->next) {
        if (!appendDeclaration(space)) return false;
    }
    if (element == mRoot) mDeclarationsEnd = mXML.size();
    for (const xmlAttr* attribute = element->properties; attribute; attribute = attribute->next) {
        need(attribute->ns, element);
        if (!appendAttribute(attribute)) return false;
    }
    return true;
}

void RawXML::appendName(const xmlNs* space, const xmlChar* name) {
    if (space && space->prefix) (mXML += xmlCString(space->prefix)) += ':';
    mXML += xmlCString(name);
}

bool RawXML::appendDeclaration(const xmlNs* space) {
    if (!space->href || std::strchr(xmlCString(space->href), '"')) return false;
    mXML += " xmlns";
    if (space->prefix) (mXML += ':') += xmlCString(space->prefix);
    ((mXML += "=\"") += xmlCString(space->href)) += '"';
    return true;
}

bool RawXML::appendAttribute(const xmlAttr* attribute) {
    mXML += ' ';
    appendName(attribute->ns, attribute->name);
    mXML += "=\"";
    for (const xmlNode* part = attribute->children; part; part = part->next) {
        if (part->type == XML_ENTITY_REF_NODE) {
            ((mXML += '&') += xmlCString(part->name)) += ';';
            continue;
        }
        // Where the document names no encoding, libxml2 writes references for them.
        const bool mayBeWide = attribute->doc && attribute->doc->encoding;
        if (part->type != XML_TEXT_NODE || (!mayBeWide && !isASCII(part->content))) return false;
        appendEscaped(part->content, kAttributeSpecials, mXML);
    }
    mXML += '"';
    return true;
}

bool RawXML::appendByLibrary(xmlNodePtr tree) {
    const std::unique_ptr<xmlNode, decltype(&xmlFreeNode)> copy(xmlDocCopyNode(tree, tree->doc, 1),
                                                                xmlFreeNode);
    const std::unique_ptr<xmlBuffer, decltype(&xmlBufferFree)> buffer(xmlBufferCreate(),
                                                                      xmlBufferFree);
    if (!copy || !buffer) return false;
    if (xmlNodeDump(buffer.get(), tree->doc, copy.get(), 0, 0) < 0) return false;
    mXML.append(xmlCString(xmlBufferContent(buffer.get())),
                static_cast<std::size_t>(xmlBufferLength(buffer.get())));
    return true;
}

void RawXML::need(const xmlNs* space, const xmlNode* user) {
    if (!space || std::find(mNeeded.begin(), mNeeded.end(), space) != mNeeded.end()) return;
    if (space->prefix && std::strcmp(xmlCString(space->prefix), "xml") == 0) return;
    for (const xmlNode* node = user;; node = node->parent) {
        if (isDeclaredAt(node, space)) return;
        if (node == mRoot) break;
    }
    mNeeded.push_back(space);
}

bool RawXML::declareNeeded() {
    if (mNeeded.empty()) return true;
    const std::string rest = mXML.substr(mDeclarationsEnd);
    mXML.resize(mDeclarationsEnd);
    for (const xmlNs* space : mNeeded) {
        if (!appendDeclaration(space)) return false;
    }
    mXML += rest;
    return true;
}

}  // namespace Orvane::FeedParser
