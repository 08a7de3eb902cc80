#include <Orvane/OVLink.h>

#include "Foundation/AutoreleasePool.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

namespace {

using Words = std::set<std::string>;

std::optional<std::vector<OVLink>> linksOf(const std::string& document) {
    return OVLink::linksInXML(OVXMLElement::parse(document), "http://e.org/a/");
}

const std::string kAtom = "xmlns='http://www.w3.org/2005/Atom'";

}  // namespace

TEST(OVLink, HasTheWordsOfItsRelationInLowerCase) {
    const auto link = OVLink::make("ALTERNATE Feed", "application/atom+xml", "T", "f", "");
    ASSERT_TRUE(link);
    EXPECT_EQ(link->relations(), (Words{"alternate", "feed"}));
    EXPECT_EQ(link->MIMEType(), "application/atom+xml");
    EXPECT_EQ(link->title(), "T");
    EXPECT_EQ(link->href(), "f");
    EXPECT_EQ(link->linkKind(), OVLink::Kind::AtomFeed);
}

TEST(OVLink, HasNoRelationsWithoutAny) {
    EXPECT_FALSE(OVLink::make({}, {}, {}, "f")->relations());
    EXPECT_FALSE(OVLink::make("", {}, {}, "f")->relations());
}

TEST(OVLink, LeadsSomewhere) {
    EXPECT_FALSE(OVLink::make("self", {}, {}, ""));
    EXPECT_FALSE(OVLink::make("self", {}, {}, {}));
    EXPECT_EQ(OVLink::make("self", {}, {}, "b", "http://e.org/a/")->URL(), "http://e.org/a/b");
    EXPECT_EQ(OVLink::make("self", {}, {}, "b c", "http://e.org/a/")->URL(),
              "http://e.org/a/b%20c");
}

TEST(OVLink, IsOfAKindThatIsKnown) {
    EXPECT_EQ(OVLink::make("self", {}, {}, "f")->linkKind(), OVLink::Kind::Self);
    EXPECT_EQ(OVLink::make("stylesheet", "text/css", {}, "f")->linkKind(), OVLink::Kind::Nothing);
}

TEST(OVLink, StandsInTheHeadOfAPage) {
    const auto links = linksOf(
        "<html xmlns='http://www.w3.org/1999/xhtml'><link href='no'/><head><title/>"
        "<link rel='self' href='1'/><link href=''/><link rel='x'/></head></html>");
    ASSERT_TRUE(links);
    ASSERT_EQ(links->size(), 1u);
    EXPECT_EQ(links->at(0).URL(), "http://e.org/a/1");
    EXPECT_FALSE(linksOf("<html xmlns='http://www.w3.org/1999/xhtml'><body/></html>"));
}

TEST(OVLink, StandsInTheChannelOfRDF) {
    const std::string start =
        "<r:RDF xmlns:r='http://www.w3.org/1999/02/22-rdf-syntax-ns#' "
        "xmlns='http://purl.org/rss/1.0/'>";
    const auto links = linksOf(start + "<channel><link>http://e.org/page</link></channel></r:RDF>");
    ASSERT_TRUE(links);
    ASSERT_EQ(links->size(), 1u);
    EXPECT_EQ(links->at(0).href(), "http://e.org/page");
    EXPECT_EQ(links->at(0).relations(), Words{"alternate"});
    EXPECT_FALSE(linksOf(start + "</r:RDF>"));
}

TEST(OVLink, OfPlainRSSIsATextAndAnAlternate) {
    const auto links = linksOf("<channel><link type='t'>page</link><link/></channel>");
    ASSERT_EQ(links->size(), 1u);
    EXPECT_EQ(links->at(0).href(), "page");
    EXPECT_EQ(links->at(0).relations(), Words{"alternate"});
    EXPECT_EQ(links->at(0).MIMEType(), "t");
}

TEST(OVLink, OfAtomIsAnAlternateUnlessItSaysOtherwise) {
    const auto links = linksOf("<feed " + kAtom +
                               "><link href='1' title='T'/>"
                               "<link rel='self' href='2'/></feed>");
    ASSERT_EQ(links->size(), 2u);
    EXPECT_EQ(links->at(0).relations(), Words{"alternate"});
    EXPECT_EQ(links->at(0).title(), "T");
    EXPECT_EQ(links->at(1).relations(), Words{"self"});
    const auto other = linksOf("<x xmlns='urn:x'><link href='1'/></x>");
    EXPECT_FALSE(other->at(0).relations());
}

TEST(OVLink, IsNotInWhatIsNotThere) {
    EXPECT_FALSE(OVLink::linksInXML(std::nullopt));
    EXPECT_EQ(linksOf("<a/>")->size(), 0u);
}

TEST(OVXMLElement, IsLookedAt) {
    const auto root = OVXMLElement::parse("<x:a xmlns:x='urn:x' b='1'><x:c>t</x:c>u<d/></x:a>");
    ASSERT_TRUE(root);
    EXPECT_EQ(root->name(), "x:a");
    EXPECT_EQ(root->localName(), "a");
    EXPECT_EQ(root->namespaceURI(), "urn:x");
    EXPECT_EQ(root->attribute("b"), "1");
    EXPECT_EQ(OVXMLElement::parse("<a b='1' xmlns:p='urn:p' p:c='2'/>")->attributeNames(),
              (std::vector<std::string>{"b", "p:c"}));
    EXPECT_TRUE(OVXMLElement::parse("<a/>")->attributeNames().empty());
    EXPECT_FALSE(root->attribute("c"));
    EXPECT_EQ(root->stringValue(), "tu");
    ASSERT_EQ(root->children().size(), 2u);
    EXPECT_FALSE(root->children()[1].namespaceURI());
    EXPECT_EQ(root->children()[1].XMLString(), "<d/>");
}

TEST(OVXMLElement, OutlivesItsParents) {
    std::optional<OVXMLElement> child;
    {
        const auto root = OVXMLElement::parse("<a><b>t</b></a>");
        child = root->children()[0];
    }
    EXPECT_EQ(child->stringValue(), "t");
}

TEST(OVXMLElement, ReadsHTMLOnRequest) {
    Support::LogCapture log;
    EXPECT_FALSE(OVXMLElement::parse(""));
    EXPECT_EQ(OVXMLElement::parse("<html><p>a<p>b</html>", true)->localName(), "html");
}
