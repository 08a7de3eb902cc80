#include "FeedParser/Text/SafeMarkupWriter.h"

#include "FeedParser/Text/Blanks.h"
#include "FeedParser/Text/ForeignElements.h"
#include "FeedParser/Text/HTMLElements.h"
#include "FeedParser/Text/XMLCharacters.h"
#include "Utilities/XMLText.h"

#include <libxml/tree.h>

#include <algorithm>
#include <array>
#include <memory>
#include <utility>
#include <vector>

namespace Orvane::FeedParser {

namespace {

constexpr std::string_view kXHTML = "http://www.w3.org/1999/xhtml";
constexpr std::string_view kSVG = "http://www.w3.org/2000/svg";
constexpr std::string_view kMathML = "http://www.w3.org/1998/Math/MathML";
/// Of the tree that is written. What is deeper is nothing that a reader could see.
constexpr int kDeepest = 1000;

std::string valueOf(const xmlAttr* attribute) {
    const xmlNode* child = attribute->children;
    if (!child) return {};
    if (!child->next && child->type == XML_TEXT_NODE) return std::string(xmlView(child->content));
    xmlChar* value = xmlNodeListGetString(attribute->doc, child, 1);
    std::string result(xmlView(value));
    xmlFree(value);
    return result;
}

/// The name in lower case, with "xml:" or "xlink:" where it has that prefix. Empty for other
/// prefixes.
std::string nameOf(const xmlAttr* attribute) {
    std::string name = XMLCharacters::toLower(xmlView(attribute->name));
    if (!attribute->ns) return name;
    const std::string_view prefix = xmlView(attribute->ns->prefix);
    if (prefix == "xml" || prefix == "xlink") return std::string(prefix) + ":" + name;
    return {};
}

const xmlAttr* findAttribute(const xmlNode* node, std::string_view name) {
    const xmlAttr* attribute = node->properties;
    while (attribute && nameOf(attribute) != name)
        attribute = attribute->next;
    return attribute;
}

std::string attributeOf(const xmlNode* node, std::string_view name) {
    const xmlAttr* attribute = findAttribute(node, name);
    return attribute ? valueOf(attribute) : std::string();
}

std::string_view namespaceOf(const xmlNode* node) {
    return node->ns ? xmlView(node->ns->href) : std::string_view();
}

template <std::size_t N>
bool isOneOf(std::string_view name, const std::array<std::string_view, N>& list) {
    return std::find(list.begin(), list.end(), name) != list.end();
}

}  // namespace

std::string SafeMarkupWriter::write(const _xmlDoc* document) {
    const xmlNode* root = xmlDocGetRootElement(document);
    if (!root) return {};
    writeChildren(root, Place());
    if (mAttributes.needsNames()) {
        mOut.clear();
        mAttributes.learnNames();
        writeChildren(root, Place());
    }
    XMLCharacters::scrub(mOut);
    return std::move(mOut);
}

void SafeMarkupWriter::writeChildren(const _xmlNode* node, const Place& place) {
    if (place.depth > kDeepest) return;
    Place inside = place;
    ++inside.depth;
    for (const xmlNode* child = node->children; child; child = child->next)
        writeNode(child, inside);
}

void SafeMarkupWriter::writeNode(const _xmlNode* node, const Place& place) {
    switch (node->type) {
        case XML_ELEMENT_NODE:
            return writeElement(node, place);
        case XML_TEXT_NODE:
        case XML_CDATA_SECTION_NODE:
            return writeText(xmlView(node->content));
        case XML_ENTITY_REF_NODE:
            mOut += "&amp;";
            writeText(xmlView(node->name));
            mOut += ';';
            return;
        default:
            return;
    }
}

void SafeMarkupWriter::writeElement(const _xmlNode* node, const Place& place) {
    const std::string name = XMLCharacters::toLower(xmlView(node->name));
    const std::string_view space = namespaceOf(node);
    const bool isForeign = place.vocabulary != Vocabulary::HTML;
    if (space == kSVG || (space.empty() && place.vocabulary == Vocabulary::SVG)) {
        return writeSVG(node, name, place);
    }
    if (space == kMathML || (space.empty() && place.vocabulary == Vocabulary::MathML)) {
        return writeMathML(node, name, place);
    }
    if (!space.empty() && space != kXHTML) return writeChildren(node, place);
    // HTML has no place within a drawing.
    if (isForeign && place.vocabulary == Vocabulary::SVG) return;
    if (name == "svg") return writeSVG(node, name, place);
    if (name == "math") return writeMathML(node, name, place);
    Place inside = place;
    inside.vocabulary = Vocabulary::HTML;
    writeHTML(node, name, inside);
}

void SafeMarkupWriter::writeHTML(const _xmlNode* node, const std::string& name, Place place) {
    const HTMLElement* element = HTMLElement::find(name);
    if (element && element->is(HTMLElement::Left)) return;
    // A link within a link can't be.
    const bool isSecondLink = name == "a" && place.isInLink;
    if (!element || !element->is(HTMLElement::Shown) || isSecondLink) {
        return writeUnshown(node, name, place);
    }
    Place inside = place;
    if (name == "a") inside.isInLink = true;
    const bool isEmpty = element->is(HTMLElement::Empty);
    if (namespaceOf(node) == kXHTML || !place.space.empty()) inside.space = kXHTML;
    writeWhole(node, name, name, place, inside, isEmpty);
}

void SafeMarkupWriter::writeUnshown(const _xmlNode* node, const std::string& name,
                                    const Place& place) {
    if (name == "iframe") return writeFrame(node, place);
    if (name == "input") return writeField(node);
    if (name == "form") {
        Place inside = place;
        if (namespaceOf(node) == kXHTML || !place.space.empty()) inside.space = kXHTML;
        return writeWhole(node, "div", "div", place, inside, false);
    }
    writeChildren(node, place);
    // The choices of a list stand apart.
    if (name == "option" && !mOut.ends_with(' ')) mOut += ' ';
}

void SafeMarkupWriter::writeSVG(const _xmlNode* node, const std::string& name, Place place) {
    Place inside = place;
    inside.vocabulary = Vocabulary::SVG;
    // Of these a reader sees what they hold.
    if (name == "switch" || name == "textpath") return writeChildren(node, inside);
    const std::string_view spelling = ForeignElements::findSVG(name);
    if (spelling.empty() || (name == "a" && place.isInLink)) return;
    inside.space = kSVG;
    if (name == "a") inside.isInLink = true;
    writeWhole(node, name, spelling, place, inside, false);
}

void SafeMarkupWriter::writeMathML(const _xmlNode* node, const std::string& name, Place place) {
    const HTMLElement* html = HTMLElement::find(name);
    if (ForeignElements::isLeftMathML(name) || (html && html->is(HTMLElement::Left))) return;
    Place inside = place;
    inside.vocabulary = Vocabulary::MathML;
    if (!ForeignElements::isMathML(name)) return writeChildren(node, inside);
    inside.space = kMathML;
    writeWhole(node, name, name, place, inside, false);
}

void SafeMarkupWriter::writeFrame(const _xmlNode* node, const Place& place) {
    const std::string source = attributeOf(node, "src");
    const SafeAttributes::Value url =
        source.empty() ? std::nullopt : mAttributes.getURLs().make(source, SafeURL::Use::Link);
    if (!url) return;
    std::string title = attributeOf(node, "title");
    if (title.empty()) title = *url;
    if (place.isInLink) return writeText(title);
    mOut += "<a";
    writeAttribute("href", *url);
    mOut += '>';
    writeText(title);
    mOut += "</a>";
}

void SafeMarkupWriter::writeField(const _xmlNode* node) {
    constexpr std::array<std::string_view, 10> kOfText = {
        "", "button", "email", "number", "reset", "search", "submit", "tel", "text", "url"};
    const std::string type = XMLCharacters::toLower(attributeOf(node, "type"));
    if (type == "image") {
        const SafeAttributes::Value source =
            mAttributes.getURLs().make(attributeOf(node, "src"), SafeURL::Use::Image);
        if (!source) return;
        mOut += "<img";
        writeAttribute("src", *source);
        writeAttribute("alt", attributeOf(node, "alt"));
        mOut += " />";
    } else if (type == "checkbox" || type == "radio") {
        mOut += "<input";
        writeAttribute("type", type);
        if (findAttribute(node, "checked")) writeAttribute("checked", "checked");
        writeAttribute("disabled", "disabled");
        mOut += " />";
    } else if (isOneOf(type, kOfText)) {
        writeText(attributeOf(node, "value"));
    }
}

void SafeMarkupWriter::writeWhole(const _xmlNode* node, std::string_view name,
                                  std::string_view spelling, const Place& outside,
                                  const Place& inside, bool isEmpty) {
    mOut += '<';
    mOut += spelling;
    if (inside.space != outside.space) writeAttribute("xmlns", inside.space);
    writeAttributes(node, name, inside.vocabulary);
    if (isEmpty) {
        mOut += " />";
        // What XML let stand in it.
        return writeChildren(node, outside);
    }
    mOut += '>';
    writeChildren(node, inside);
    mOut += "</";
    mOut += spelling;
    mOut += '>';
}

void SafeMarkupWriter::writeAttributes(const _xmlNode* node, std::string_view element,
                                       Vocabulary vocabulary) {
    // Of names that differ by case or prefix alone the first counts.
    std::vector<std::string> written;
    for (const xmlAttr* attribute = node->properties; attribute; attribute = attribute->next) {
        const std::string name = nameOf(attribute);
        const SafeAttributes::Value value =
            mAttributes.make(vocabulary, element, name, valueOf(attribute));
        if (!value) continue;
        std::string spelling(SafeAttributes::getSpelling(vocabulary, name));
        if (spelling == "xlink:href") spelling = "href";
        if (std::find(written.begin(), written.end(), spelling) != written.end()) continue;
        writeAttribute(spelling, *value);
        written.push_back(std::move(spelling));
    }
    const bool hasControls = std::find(written.begin(), written.end(), "controls") != written.end();
    // Nothing starts by itself, so there must be something to start it by.
    const bool plays = vocabulary == Vocabulary::HTML && (element == "audio" || element == "video");
    if (plays && !hasControls) writeAttribute("controls", "controls");
}

void SafeMarkupWriter::writeAttribute(std::string_view name, std::string_view value) {
    mOut += ' ';
    mOut += name;
    mOut += "=\"";
    for (const char c : value) {
        if (isBlank(c)) {
            mOut += ' ';
        } else {
            writeEscaped(c);
        }
    }
    mOut += '"';
}

void SafeMarkupWriter::writeText(std::string_view text) {
    constexpr std::string_view kSpecial = "&<>\r\xC2";
    for (;;) {
        const std::size_t end = text.find_first_of(kSpecial);
        mOut += text.substr(0, end);
        if (end == std::string_view::npos) return;
        const char c = text[end];
        text.remove_prefix(end + 1);
        if (c == '\xC2' && text.starts_with('\xA0')) {
            // A no-break space can't be told from a space by who looks at the text.
            mOut += "&#160;";
            text.remove_prefix(1);
        } else if (c != '\r') {
            writeEscaped(c);
        }
    }
}

void SafeMarkupWriter::writeEscaped(char c) {
    switch (c) {
        case '&':
            mOut += "&amp;";
            break;
        case '<':
            mOut += "&lt;";
            break;
        case '>':
            mOut += "&gt;";
            break;
        case '"':
            mOut += "&quot;";
            break;
        default:
            mOut += c;
    }
}

}  // namespace Orvane::FeedParser
