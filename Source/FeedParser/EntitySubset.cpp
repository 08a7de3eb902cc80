#include "FeedParser/EntitySubset.h"

#include "FeedParser/Text/CharacterEntities.h"
#include "Foundation/AssertionFailure.h"
#include "Utilities/XMLText.h"

#include <libxml/entities.h>
#include <libxml/globals.h>
#include <libxml/parserInternals.h>
#include <libxml/tree.h>
#include <algorithm>
#include <cstdio>
#include <cstring>
#include <utility>
#include <vector>

namespace Orvane::FeedParser {

EntitySubset& EntitySubset::shared() {
    // Never destroyed: documents may be freed as the process ends.
    static auto* const sShared = new EntitySubset;
    return *sShared;
}

EntitySubset::EntitySubset()
    : mScratch(xmlNewDoc(xmlChars("1.0"))),
      mSubset(xmlNewDtd(mScratch, nullptr, nullptr, nullptr)) {
    OV_ASSERT(mSubset);
    const auto known = CharacterEntities::all();
    std::vector<CharacterEntities::Entity> entities(known.begin(), known.end());
    entities.push_back({"tau", 0x03C4});
    std::sort(entities.begin(), entities.end(),
              [](const auto& a, const auto& b) { return std::strcmp(a.name, b.name) < 0; });
    for (const CharacterEntities::Entity& entity : entities) {
        add(entity.name, entity.character);
    }
    xmlUnlinkNode(reinterpret_cast<xmlNodePtr>(mSubset));
}

void EntitySubset::add(const char* name, unsigned character) {
    char value[16];
    std::snprintf(value, sizeof value, "&#%u;", character);
    xmlEntityPtr entity = xmlAddDtdEntity(mScratch, xmlChars(name), XML_INTERNAL_GENERAL_ENTITY,
                                          nullptr, nullptr, xmlChars(value));
    // The five that XML knows itself cannot be declared anew.
    if (!entity) return;
    // What the parser would otherwise make of the value at the first reference: nodes of a document
    // that ends before the entity does.
    char utf8[8] = {};
    xmlCopyChar(0, reinterpret_cast<xmlChar*>(utf8), static_cast<int>(character));
    xmlNodePtr text = xmlNewDocText(mScratch, xmlChars(utf8));
    OV_ASSERT(text);
    text->parent = reinterpret_cast<xmlNodePtr>(entity);
    entity->children = entity->last = text;
    entity->owner = 1;
    constexpr int kCheckedOnce = 2;
    entity->checked = kCheckedOnce;
}

void EntitySubset::attachTo(xmlDocPtr document) {
    if (document->extSubset == mSubset) return;
    if (xmlDtdPtr other = document->extSubset) {
        xmlUnlinkNode(reinterpret_cast<xmlNodePtr>(other));
        xmlFreeDtd(other);
    }
    document->extSubset = mSubset;
    mSubset->doc = document;
}

void EntitySubset::detachFrom(xmlDocPtr document) {
    if (!document || document->extSubset != mSubset) return;
    document->extSubset = nullptr;
    mSubset->doc = nullptr;
}

thread_local EntitySubset::NextDocument* EntitySubset::NextDocument::sCurrent = nullptr;

EntitySubset::NextDocument::NextDocument() {
    EntitySubset::shared();  // whose own document is not the next one
    sCurrent = this;
    xmlRegisterNodeDefault(nodeMade);
}

EntitySubset::NextDocument::~NextDocument() {
    release();
}

void EntitySubset::NextDocument::release() {
    if (sCurrent == this) {
        sCurrent = nullptr;
        xmlRegisterNodeDefault(nullptr);
    }
    EntitySubset::shared().detachFrom(std::exchange(mDocument, nullptr));
}

void EntitySubset::NextDocument::nodeMade(xmlNodePtr node) noexcept {
    if (node->type != XML_DOCUMENT_NODE || !sCurrent) return;
    sCurrent->mDocument = reinterpret_cast<xmlDocPtr>(node);
    EntitySubset::shared().attachTo(sCurrent->mDocument);
    sCurrent = nullptr;
    xmlRegisterNodeDefault(nullptr);
}

}  // namespace Orvane::FeedParser
