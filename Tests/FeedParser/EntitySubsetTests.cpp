#include "FeedParser/EntitySubset.h"

#include "FeedParser/Text/CharacterEntities.h"

#include <gtest/gtest.h>
#include <libxml/entities.h>
#include <libxml/parser.h>
#include <libxml/tree.h>

#include <set>
#include <string>

using Orvane::CharacterEntities;
using Orvane::FeedParser::EntitySubset;

namespace {

const xmlChar* asXML(const char* text) {
    return reinterpret_cast<const xmlChar*>(text);
}

std::string valueOf(xmlDoc* document, const char* name) {
    const xmlEntity* entity = xmlGetDocEntity(document, asXML(name));
    return entity ? reinterpret_cast<const char*>(entity->content) : "none";
}

class EntitySubsetTest : public testing::Test {
 protected:
    ~EntitySubsetTest() override {
        EntitySubset::shared().detachFrom(document);
        xmlFreeDoc(document);
    }
    xmlDoc* document = xmlNewDoc(asXML("1.0"));
};

TEST_F(EntitySubsetTest, HasEachEntityOfHTMLAsAReferenceToItsCharacter) {
    EntitySubset::shared().attachTo(document);
    EXPECT_EQ(valueOf(document, "Aacute"), "&#193;");
    EXPECT_EQ(valueOf(document, "tau"), "&#964;");
    EXPECT_EQ(valueOf(document, "Tau"), "&#932;");
    EXPECT_EQ(valueOf(document, "hearts"), "&#9829;");
    EXPECT_EQ(valueOf(document, "nosuch"), "none");
    std::set<std::string> names{"tau"};
    for (const CharacterEntities::Entity& entity : CharacterEntities::all()) {
        names.insert(entity.name);
        EXPECT_NE(valueOf(document, entity.name), "none") << entity.name;
    }
    // The 252 of HTML, and "apos", which XML knows itself.
    EXPECT_EQ(names.size(), 253u);
}

TEST_F(EntitySubsetTest, ReplacesTheSubsetThatADocumentHas) {
    xmlDtd* own = xmlNewDtd(document, asXML("a"), nullptr, nullptr);
    ASSERT_EQ(document->extSubset, own);
    EntitySubset::shared().attachTo(document);
    EXPECT_EQ(valueOf(document, "eacute"), "&#233;");
}

TEST_F(EntitySubsetTest, LeavesADocumentOnlyIfItIsThere) {
    EntitySubset::shared().attachTo(document);
    EntitySubset::shared().detachFrom(document);
    EXPECT_EQ(document->extSubset, nullptr);
    EntitySubset::shared().detachFrom(nullptr);
    xmlDtd* own = xmlNewDtd(document, asXML("a"), nullptr, nullptr);
    EntitySubset::shared().detachFrom(document);
    EXPECT_EQ(document->extSubset, own);
}

TEST_F(EntitySubsetTest, JoinsTheNextDocumentAsItIsMade) {
    EntitySubset::NextDocument next;
    EXPECT_EQ(next.document(), nullptr);
    xmlDoc* made = xmlNewDoc(asXML("1.0"));
    EXPECT_EQ(next.document(), made);
    EXPECT_EQ(valueOf(made, "eacute"), "&#233;");
    xmlDoc* later = xmlNewDoc(asXML("1.0"));
    EXPECT_EQ(later->extSubset, nullptr);
    next.release();
    EXPECT_EQ(made->extSubset, nullptr);
    xmlFreeDoc(made);
    xmlFreeDoc(later);
}

TEST_F(EntitySubsetTest, JoinsNoneAnyMoreWhenNobodyWaits) {
    { const EntitySubset::NextDocument next; }
    xmlDoc* made = xmlNewDoc(asXML("1.0"));
    EXPECT_EQ(made->extSubset, nullptr);
    xmlFreeDoc(made);
}

}  // namespace
