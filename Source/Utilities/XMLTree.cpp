#include "Utilities/XMLTree.h"

#include <libxml/tree.h>

#include <new>

namespace Orvane {

using namespace Foundation;

Ref<XMLTree> XMLTree::empty() {
    xmlDoc* document = xmlNewDoc(nullptr);
    if (!document) throw std::bad_alloc();
    // Without one, libxml2 writes attributes in ASCII.
    document->encoding = xmlStrdup(reinterpret_cast<const xmlChar*>("UTF-8"));
    return new XMLTree(document);
}

XMLTree::~XMLTree() {
    for (xmlNode* node : mDetached) {
        xmlFreeNode(node);
    }
    xmlFreeDoc(mDocument);
}

xmlNode* XMLTree::root() const {
    return xmlDocGetRootElement(mDocument);
}

void XMLTree::setRoot(xmlNode* node) {
    xmlDocSetRootElement(mDocument, node);
}

}  // namespace Orvane
