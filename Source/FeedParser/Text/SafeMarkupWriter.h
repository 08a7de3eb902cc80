#pragma once

#include "FeedParser/Text/SafeAttributes.h"
#include "Foundation/Uncopyable.h"

#include <string>
#include <string_view>

struct _xmlDoc;
struct _xmlNode;

namespace Orvane::FeedParser {

struct HTMLElement;

/// Writes a tree of markup as `SafeMarkup` says.
class SafeMarkupWriter : Foundation::Uncopyable {
 public:
    /// `base` may be null; else it must outlive this.
    explicit SafeMarkupWriter(Foundation::URL* base) : mAttributes(base) {}

    /// All below the root of a document.
    std::string write(const _xmlDoc* document);

 private:
    using Vocabulary = SafeAttributes::Vocabulary;
    /// What an element inherits from those around it.
    struct Place {
        Vocabulary vocabulary = Vocabulary::HTML;
        std::string_view space;  ///< the namespace in force, as written
        bool isInLink = false;
        int depth = 0;
    };

    void writeNode(const _xmlNode* node, const Place& place);
    void writeChildren(const _xmlNode* node, const Place& place);
    void writeElement(const _xmlNode* node, const Place& place);
    void writeHTML(const _xmlNode* node, const std::string& name, Place place);
    void writeUnshown(const _xmlNode* node, const std::string& name, const Place& place);
    void writeSVG(const _xmlNode* node, const std::string& name, Place place);
    void writeMathML(const _xmlNode* node, const std::string& name, Place place);
    void writeFrame(const _xmlNode* node, const Place& place);
    void writeField(const _xmlNode* node);
    void writeWhole(const _xmlNode* node, std::string_view name, std::string_view spelling,
                    const Place& outside, const Place& inside, bool isEmpty);
    void writeAttributes(const _xmlNode* node, std::string_view element, Vocabulary vocabulary);
    void writeAttribute(std::string_view name, std::string_view value);
    void writeText(std::string_view text);
    void writeEscaped(char c);

    SafeAttributes mAttributes;
    std::string mOut;
};

}  // namespace Orvane::FeedParser
