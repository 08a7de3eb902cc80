#include "FeedParser/Text/NodeContent.h"

#include "Utilities/XMLText.h"

#include <libxml/tree.h>
#include <libxml/xmlstring.h>

namespace Orvane {

namespace {

bool isReadable(const xmlNode* element) {
    for (const char* hidden : {"script", "style", "object", "img", "head"}) {
        if (xmlStrcasestr(element->name, xmlChars(hidden))) return false;
    }
    return true;
}

void appendText(const xmlNode* node, Foundation::MutableString& output) {
    const bool isText = node->type == XML_TEXT_NODE || node->type == XML_CDATA_SECTION_NODE ||
                        node->type == XML_ENTITY_REF_NODE;
    if (!isText || !node->content) return;
    output.append(xmlView(node->content));
    output.append(std::string_view(" "));
}

const xmlNode* firstReadableChild(const xmlNode* node) {
    return node->type == XML_ELEMENT_NODE && isReadable(node) ? node->children : nullptr;
}

}  // namespace

void _contentFromLibxml2Node(const xmlNode* node, Foundation::MutableString* output, void*) {
    // A walk without recursion: how deep pages are nested is for their authors to say.
    const xmlNode* current = node;
    while (current) {
        appendText(current, *output);
        const xmlNode* next = firstReadableChild(current);
        while (!next && current != node) {
            next = current->next;
            if (!next) current = current->parent;
        }
        current = next;
    }
}

}  // namespace Orvane
