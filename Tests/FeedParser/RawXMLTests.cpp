#include "FeedParser/RawXML.h"

#include <gtest/gtest.h>
#include <libxml/parser.h>
#include <libxml/tree.h>

#include <memory>
#include <string>

using Orvane::FeedParser::RawXML;

namespace {

using Document = std::unique_ptr<xmlDoc, decltype(&xmlFreeDoc)>;

Document read(const std::string& xml) {
    constexpr int kOptions = XML_PARSE_NONET | XML_PARSE_NOCDATA | XML_PARSE_NOWARNING;
    return {xmlReadMemory(xml.data(), static_cast<int>(xml.size()), nullptr, nullptr, kOptions),
            xmlFreeDoc};
}

/// What libxml2 writes of a copy.
std::string dumped(xmlNode* node) {
    xmlNode* copy = xmlDocCopyNode(node, node->doc, 1);
    xmlBuffer* buffer = xmlBufferCreate();
    xmlNodeDump(buffer, node->doc, copy, 0, 0);
    std::string xml(reinterpret_cast<const char*>(xmlBufferContent(buffer)));
    xmlBufferFree(buffer);
    xmlFreeNode(copy);
    return xml;
}

void compareAll(RawXML& writer, xmlNode* node) {
    for (; node; node = node->next) {
        if (node->type != XML_ELEMENT_NODE) continue;
        EXPECT_EQ(writer.outer(node).value_or("none"), dumped(node));
        std::string inner;
        for (xmlNode* child = node->children; child; child = child->next) {
            inner += dumped(child);
        }
        EXPECT_EQ(writer.inner(node).value_or("none"), inner);
        compareAll(writer, node->children);
    }
}

class RawXMLOf : public testing::TestWithParam<const char*> {};

TEST_P(RawXMLOf, EachElementIsWhatLibxml2WritesOfACopy) {
    const Document document = read(GetParam());
    ASSERT_NE(document, nullptr);
    RawXML writer;
    compareAll(writer, xmlDocGetRootElement(document.get()));
}
INSTANTIATE_TEST_SUITE_P(
    All, RawXMLOf,
    testing::Values(
        "<a/>", "<a></a>", "<a> b </a>", "<a>&lt;&gt;&amp;\"'&#13;&#10;&#9;</a>",
        "<a b='&lt;&gt;&amp;\"&#13;&#10;&#9;' c=\"'\"/>", "<a><![CDATA[<b>&]]>c</a>",
        "<a><!-- b --><?c d?><?e?><f/></a>", "<a>\xC3\xA9<b c='\xC3\xA9'/></a>",
        "<?xml version='1.0' encoding='utf-8'?><a b='\xC3\xA9'>\xE2\x82\xAC</a>",
        "<a xmlns='urn:a'><b/><c xmlns=''><d/></c></a>",
        "<x:a xmlns:x='urn:x' xmlns:y='urn:y'><x:b y:c='d'><y:e/></x:b><f x:g='h'/></x:a>",
        "<a xmlns:x='urn:x'><b><c x:d='e'/><x:f xmlns:x='urn:other'/><x:g/></b></a>",
        "<a xmlns='urn:a' xmlns:y='urn:y'><y:b><c/><d xmlns='urn:d'><y:e f='g'/></d></y:b></a>",
        "<a xml:lang='en' xml:base='b'><c xml:space='preserve'>d</c></a>",
        "<a xmlns:x='urn:x&amp;y' xmlns:q='a&quot;b'><b x:c='d' q:e='f'/></a>",
        "<!DOCTYPE a [<!ENTITY b 'c'>]><a d='&b;'>&b;<e>&b;f</e></a>",
        "<!DOCTYPE html PUBLIC '-//W3C//DTD XHTML 1.0 Strict//EN' "
        "'http://www.w3.org/TR/xhtml1/DTD/xhtml1-strict.dtd'><html "
        "xmlns='http://www.w3.org/1999/xhtml'><p/><br/><a name='b'/></html>"));

}  // namespace
