#include "Utilities/XMLNode.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Support/LogCapture.h"
#include "Utilities/XMLTexts.h"

#include <gtest/gtest.h>

using namespace Foundation;
using namespace Orvane;

TEST(XMLNode, WritesTextAsTextOrAsCDATA) {
    const Ref<XMLNode> text = XMLNode::text("a<b");
    EXPECT_EQ(text->getKind(), XMLNode::Kind::Text);
    EXPECT_EQ(xmlOf(*text), "a&lt;b");
    const Ref<XMLNode> cdata = XMLNode::ov_CDATAWithStringValue("a<b");
    EXPECT_EQ(cdata->getKind(), XMLNode::Kind::CDATA);
    EXPECT_EQ(xmlOf(*cdata), "<![CDATA[a<b]]>");
    EXPECT_EQ(Ref<String>(cdata->getStringValue())->utf8(), "a<b");
}

TEST(XMLNode, WritesTheEndOfACDATASectionInsideOne) {
    const Ref<XMLElement> element = parse("<a/>");
    const Ref<XMLNode> cdata = XMLNode::ov_CDATAWithStringValue("x]]>y");
    const Ref<XMLNode> added = element->addChild(cdata);
    EXPECT_EQ(Ref<String>(parse(xmlOf(*element))->getStringValue())->utf8(), "x]]>y");
}

TEST(XMLNode, MakesNoTextOfNull) {
    EXPECT_EQ(Ref<XMLNode>(XMLNode::text(nullptr)).get(), nullptr);
    const Support::LogCapture log;
    try {
        const Ref<XMLNode> none = XMLNode::ov_CDATAWithStringValue(nullptr);
        FAIL() << "should have thrown";
    } catch (const AssertionFailure& failure) {
        EXPECT_STREQ(failure.what(), "string");
    }
}

TEST(XMLNode, LeavesOutWhatXMLCannotHold) {
    EXPECT_EQ(allowedInXML("a\x01\x1F\tb\n\rc\x7F"), "a\tb\n\rc\x7F");
    EXPECT_EQ(allowedInXML(std::string_view("a\0b", 3)), "ab");
    EXPECT_EQ(allowedInXML("a\xEF\xBF\xBE\xEF\xBF\xBF\xEF\xBF\xBD"), "a\xEF\xBF\xBD");
    EXPECT_EQ(allowedInXML("caf\xC3\xA9 \xF0\x9F\x98\x80"), "caf\xC3\xA9 \xF0\x9F\x98\x80");
    const Ref<XMLNode> text = XMLNode::text("a\x02z");
    EXPECT_EQ(xmlOf(*text), "az");
}

TEST(XMLNode, HasTheTextOfWhatIsBelowIt) {
    const Ref<XMLElement> element = parse("<a>1<b>2<c/><!--no--><![CDATA[3]]></b>4</a>");
    EXPECT_EQ(Ref<String>(element->getStringValue())->utf8(), "1234");
    const Ref<XMLElement> b = firstElement(*element);
    EXPECT_EQ(Ref<String>(b->getStringValue())->utf8(), "23");
}

TEST(XMLNode, IsTheSameAsAnotherObjectForItsNode) {
    const Ref<XMLElement> element = parse("<a><b/><c/></a>");
    const Ref<XMLElement> b = firstElement(*element);
    const Ref<XMLElement> again = firstElement(*element);
    EXPECT_NE(b.get(), again.get());
    EXPECT_TRUE(b->isEqual(again));
    EXPECT_EQ(b->getPFHashCode(), again->getPFHashCode());
    EXPECT_FALSE(b->isEqual(element));
    EXPECT_FALSE(b->isEqual(nullptr));
    EXPECT_TRUE(Ref<XMLElement>(b->getParent())->isEqual(element));
    EXPECT_EQ(Ref<XMLElement>(element->getParent()).get(), nullptr);
}

TEST(XMLNode, OutlivesTheObjectsAboveIt) {
    const Ref<XMLElement> inner = [] {
        const Ref<XMLElement> element = parse("<a><b>text</b></a>");
        return firstElement(*element);
    }();
    EXPECT_EQ(xmlOf(*inner), "<b>text</b>");
}

TEST(XMLNode, KeepsItsNamespacesWhenItIsDetached) {
    const Ref<XMLElement> element = parse("<a xmlns='urn:d' xmlns:p='urn:p'><b><p:c/></b></a>");
    const Ref<XMLElement> b = firstElement(*element);
    EXPECT_EQ(xmlOf(*b), "<b xmlns=\"urn:d\" xmlns:p=\"urn:p\"><p:c/></b>") << "and before";
    b->detach();
    EXPECT_EQ(xmlOf(*b), "<b xmlns=\"urn:d\"><p:c xmlns:p=\"urn:p\"/></b>");
    EXPECT_EQ(Ref<XMLElement>(b->getParent()).get(), nullptr);
    EXPECT_EQ(element->getChildCount(), 0u);
    b->detach();
    const Ref<XMLNode> text = XMLNode::text("x");
    text->detach();
    EXPECT_EQ(xmlOf(*text), "x");
}

TEST(XMLNode, WritesTheMarksInNamespaces) {
    const std::string xml = "<a xmlns=\"urn:x?a&amp;b\"><b/></a>";
    const Ref<XMLElement> element = parse(xml);
    EXPECT_EQ(xmlOf(*element), xml);
    EXPECT_EQ(Ref<String>(element->ov_namespace())->utf8(), "urn:x?a&b");
}
