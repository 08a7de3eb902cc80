#include <Orvane/OVException.h>
#include <Orvane/OVXMLAdditions.h>

#include "Support/DefaultZone.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

namespace {

const std::string kXHTML = "http://www.w3.org/1999/xhtml";
const std::string kAtom = "http://www.w3.org/2005/Atom";
const std::string kBadText = "\xFF";

using None = std::optional<std::string>;

OVXMLElement parse(const std::string& document) {
    return OVXMLElement::parse(document).value();
}

/// The names of elements, with blanks in between.
std::string namesOf(const std::vector<OVXMLElement>& elements) {
    std::string names;
    for (const OVXMLElement& element : elements) {
        names += (names.empty() ? "" : " ") + element.name();
    }
    return names;
}

std::string xmlOf(const std::optional<OVXMLElement>& element) {
    return element ? ov_asData(*element) : "(none)";
}

}  // namespace

TEST(OVXMLAdditions, ReadDocumentsWithTwoTolerances) {
    const Support::LogCapture log;
    EXPECT_EQ(xmlOf(ov_elementWithData("<html><br>x</html>", false)),
              "<html>\n  <br>x</br>\n</html>");
    EXPECT_EQ(xmlOf(ov_elementWithData("<html><br>x</html>", true)),
              "<html xmlns=\"" + kXHTML + "\">\n  <body><br/>x</body>\n</html>");
    EXPECT_EQ(xmlOf(ov_elementWithData("no markup", false)), "(none)");
    EXPECT_TRUE(log.contains("Couldn't parse XML data, error='"));
}

TEST(OVXMLAdditions, ReadAPieceOfXHTML) {
    EXPECT_EQ(xmlOf(ov_XHTMLElementWithData("<div xmlns='" + kXHTML + "'><b>a</b></div>")),
              "<div xmlns=\"" + kXHTML + "\">\n  <b>a</b>\n</div>");
    EXPECT_EQ(xmlOf(ov_XHTMLElementWithData("<p>a</p><p>b</p>")),
              "<div xmlns=\"" + kXHTML + "\">\n  <p>a</p>\n  <p>b</p>\n</div>");
    EXPECT_EQ(xmlOf(ov_XHTMLElementWithData("")), "<div xmlns=\"" + kXHTML + "\"/>");
}

TEST(OVXMLAdditions, MakeElements) {
    EXPECT_EQ(xmlOf(ov_elementWithName("a")), "<a/>");
    EXPECT_EQ(xmlOf(ov_elementWithName("entry", kAtom)), "<entry xmlns=\"" + kAtom + "\"/>");
    EXPECT_EQ(xmlOf(ov_elementWithName("p:a", "urn:p")), "<p:a xmlns:p=\"urn:p\"/>");
}

TEST(OVXMLAdditions, WriteDocuments) {
    const OVXMLElement element = parse("<a>caf\xC3\xA9</a>");
    EXPECT_EQ(ov_asDocumentString(element),
              "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<a>caf\xC3\xA9</a>\n");
    EXPECT_EQ(ov_asData(element), "<a>caf\xC3\xA9</a>");
}

TEST(OVXMLAdditions, TellNames) {
    const OVXMLElement element = parse("<p:a xmlns:p='urn:p'><b/></p:a>");
    EXPECT_EQ(ov_namespace(element), "urn:p");
    EXPECT_TRUE(ov_hasName(element, "a", "urn:p"));
    EXPECT_FALSE(ov_hasName(element, "p:a", "urn:p"));
    EXPECT_FALSE(ov_hasName(element, "a", {}));
    EXPECT_FALSE(ov_hasName(element, {}, "urn:p"));
    const OVXMLElement child = element.children().at(0);
    EXPECT_EQ(ov_namespace(child), std::nullopt);
    EXPECT_TRUE(ov_hasName(child, "b", {}));
}

TEST(OVXMLAdditions, TellChildrenByNamespace) {
    const OVXMLElement root =
        parse("<a xmlns:p='urn:p' xmlns:q='urn:q'>t<b/><p:c/><q:d/><p:e/></a>");
    EXPECT_EQ(namesOf(ov_childrenWithNamespace(root, "urn:p")), "p:c p:e");
    EXPECT_EQ(namesOf(ov_childrenWithoutNamespace(root, "urn:p")), "q:d");
    EXPECT_EQ(namesOf(ov_childrenWithNamespace(root, {})), "");
    EXPECT_EQ(namesOf(ov_childrenWithoutNamespace(root, {})), "p:c q:d p:e");
}

TEST(OVXMLAdditions, AddChildren) {
    OVXMLElement entry = ov_elementWithName("entry", kAtom);
    OVXMLElement title = ov_addChildWithName(entry, "title");
    EXPECT_EQ(ov_namespace(title), kAtom);
    EXPECT_EQ(xmlOf(ov_addChildWithName(title, "b", "x & <y>")),
              "<b xmlns=\"" + kAtom + "\">x &amp; &lt;y&gt;</b>");
    EXPECT_EQ(entry.children().at(0).children().at(0).stringValue(), "x & <y>")
        << "a change shows in all of the tree";
}

TEST(OVXMLAdditions, AddNoChildForAnEmptyText) {
    OVXMLElement element = ov_elementWithName("a");
    EXPECT_FALSE(ov_addChildWithName(element, "b", ""));
    EXPECT_FALSE(ov_addChildWithName(element, "b", None()));
    EXPECT_EQ(xmlOf(element), "<a/>");
}

TEST(OVXMLAdditions, AddDates) {
    const Support::DefaultZone zone("Europe/Berlin");
    OVXMLElement element = ov_elementWithName("a");
    const OVDate date(151545600.75);  // 2005-10-21 00:00:00 GMT
    EXPECT_EQ(xmlOf(ov_addChildWithName(element, "b", date, "%a %d %b %Y %H:%M:%S %z")),
              "<b>Fri 21 Oct 2005 02:00:00 +0200</b>");
    EXPECT_FALSE(ov_addChildWithName(element, "b", std::nullopt, "%Y"));
    EXPECT_EQ(element.children().size(), 1u);
}

TEST(OVXMLAdditions, AddLinks) {
    OVXMLElement element = ov_elementWithName("a");
    EXPECT_EQ(xmlOf(ov_addLinkTo(element, "http://a/b?c&d", "enclosure", "audio/mpeg",
                                 18446744073709551615u)),
              "<link rel=\"enclosure\" type=\"audio/mpeg\" href=\"http://a/b?c&amp;d\" "
              "length=\"18446744073709551615\"/>");
    EXPECT_EQ(xmlOf(ov_addLinkTo(element, "http://a/", "alternate", "")),
              "<link rel=\"alternate\" href=\"http://a/\"/>");
    EXPECT_FALSE(ov_addLinkTo(element, {}, "alternate", "x", 1));
    EXPECT_EQ(element.children().size(), 2u);
    EXPECT_THROW(ov_addLinkTo(element, "no URL", "alternate", ""), OVException);
}

TEST(OVXMLAdditions, AddTexts) {
    OVXMLElement element = parse("<a>x</a>");
    ov_addText(element, {"y<\x01"});
    ov_addText(element, ov_CDATAWithStringValue("<z>"));
    EXPECT_EQ(xmlOf(element), "<a>xy&lt;<![CDATA[<z>]]></a>");
    EXPECT_EQ(element.stringValue(), "xy<<z>");
}

TEST(OVXMLAdditions, AddCopiesOfElements) {
    OVXMLElement entry = ov_elementWithName("entry", kAtom);
    OVXMLElement content = parse("<p:x xmlns:p='urn:p'><b/></p:x>");
    OVXMLElement added = ov_addChild(entry, content);
    ov_setAttribute(content, "a", "1");
    EXPECT_EQ(added.attribute("a"), std::nullopt);
    ov_setAttribute(added, "a", "2");
    EXPECT_EQ(xmlOf(entry), "<entry xmlns=\"" + kAtom +
                                "\">\n  <p:x xmlns:p=\"urn:p\" a=\"2\">\n    <b/>\n  </p:x>\n"
                                "</entry>");
}

TEST(OVXMLAdditions, SetAttributes) {
    OVXMLElement element = parse("<a b='1' c='2'/>");
    ov_setAttribute(element, "b", "x<");
    ov_setAttribute(element, "c", {});
    ov_setAttribute(element, "none", {});
    ov_setAttribute(element, "d", "");
    EXPECT_EQ(xmlOf(element), "<a b=\"x&lt;\" d=\"\"/>");
}

TEST(OVXMLAdditions, RemoveChildrenByName) {
    OVXMLElement root = parse("<a xmlns:p='urn:p'><b/>t<p:b/><c/><b><b/></b></a>");
    ov_removeChildrenWithLocalName(root, "b", {});
    EXPECT_EQ(namesOf(root.children()), "p:b c");
    ov_removeChildrenWithLocalName(root, "b", "urn:p");
    EXPECT_EQ(namesOf(root.children()), "c");
}

TEST(OVXMLAdditions, RemoveChildrenByAttribute) {
    const std::string all = "<a><b/><b r='x'/><b r='Y'/><b r=''/><c r='y'/></a>";
    OVXMLElement byValue = parse(all);
    ov_removeChildrenWithLocalName(byValue, "b", {}, "r", "y");
    EXPECT_EQ(byValue.children().size(), 3u);
    EXPECT_EQ(byValue.children().at(0).attribute("r"), "x");
    EXPECT_EQ(byValue.children().at(1).attribute("r"), "");
    OVXMLElement withoutValue = parse(all);
    ov_removeChildrenWithLocalName(withoutValue, "b", {}, "r");
    EXPECT_EQ(withoutValue.children().size(), 4u) << "only what lacks the attribute goes";
    OVXMLElement withoutAttribute = parse(all);
    ov_removeChildrenWithLocalName(withoutAttribute, "b", {}, {}, "x");
    EXPECT_EQ(namesOf(withoutAttribute.children()), "c");
}

TEST(OVXMLAdditions, KeepDetachedElementsForWhoHoldsThem) {
    std::optional<OVXMLElement> held;
    {
        OVXMLElement root = parse("<a xmlns='urn:a'><b>x</b></a>");
        held = root.children().at(0);
        ov_removeChildrenWithLocalName(root, "b", "urn:a");
    }
    EXPECT_EQ(xmlOf(held), "<b xmlns=\"urn:a\">x</b>");
}

TEST(OVXMLAdditions, WantNames) {
    const Support::LogCapture log;
    OVXMLElement element = ov_elementWithName("a");
    EXPECT_THROW(ov_elementWithName(""), OVException);
    EXPECT_THROW(ov_setAttribute(element, "", "x"), OVException);
    EXPECT_THROW(ov_addChildWithName(element, ""), OVException);
    EXPECT_THROW(ov_addChildWithName(element, "", "x"), OVException);
    EXPECT_THROW(ov_addChildWithName(element, "", OVDate(0), "%Y"), OVException);
    EXPECT_EQ(xmlOf(element), "<a/>");
}

TEST(OVXMLAdditions, WantTextsInUTF8) {
    OVXMLElement element = ov_elementWithName("a");
    EXPECT_THROW(ov_elementWithName(kBadText), OVException);
    EXPECT_THROW(ov_hasName(element, kBadText, {}), OVException);
    EXPECT_THROW(ov_childrenWithNamespace(element, kBadText), OVException);
    EXPECT_THROW(ov_childrenWithoutNamespace(element, kBadText), OVException);
    EXPECT_THROW(ov_setAttribute(element, "b", kBadText), OVException);
    EXPECT_THROW(ov_addText(element, {kBadText}), OVException);
    EXPECT_THROW(ov_addText(element, ov_CDATAWithStringValue(kBadText)), OVException);
    EXPECT_THROW(ov_addChildWithName(element, kBadText), OVException);
    EXPECT_THROW(ov_addChildWithName(element, "b", kBadText), OVException);
    EXPECT_THROW(ov_addChildWithName(element, "b", OVDate(0), kBadText), OVException);
    EXPECT_THROW(ov_addLinkTo(element, "http://a/", kBadText, ""), OVException);
    EXPECT_THROW(ov_removeChildrenWithLocalName(element, kBadText, {}), OVException);
    EXPECT_EQ(xmlOf(element), "<a/>");
}
