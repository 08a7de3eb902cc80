#include "FeedParser/Text/NodeContent.h"

#include "Foundation/Ref.h"

#include <gtest/gtest.h>
#include <libxml/parser.h>
#include <libxml/tree.h>

#include <memory>
#include <string>

using namespace Foundation;
using Orvane::_contentFromLibxml2Node;

namespace {

using Document = std::unique_ptr<xmlDoc, void (*)(xmlDoc*)>;

Document parse(const std::string& xml) {
    return {xmlReadMemory(xml.data(), static_cast<int>(xml.size()), nullptr, nullptr, 0),
            xmlFreeDoc};
}

std::string contentOf(const std::string& xml) {
    const Document document = parse(xml);
    const Ref<MutableString> output = MutableString::mutableString();
    _contentFromLibxml2Node(xmlDocGetRootElement(document.get()), output);
    return output->utf8();
}

}  // namespace

TEST(NodeContent, PutsABlankBehindEachPiece) {
    EXPECT_EQ(contentOf("<p>one<b>two</b>three</p>"), "one two three ");
    EXPECT_EQ(contentOf("<p/>"), "");
}

TEST(NodeContent, ReadsTextAndCDATAButNoComments) {
    EXPECT_EQ(contentOf("<p>a<!-- no --><![CDATA[<b>]]><?no no?></p>"), "a <b> ");
}

TEST(NodeContent, LeavesOutWhatIsNotForReading) {
    for (const std::string name :
         {"script", "STYLE", "Object", "img", "head", "header", "noscript"}) {
        EXPECT_EQ(contentOf("<p>a<" + name + ">b<i>c</i></" + name + ">d</p>"), "a d ") << name;
    }
    EXPECT_EQ(contentOf("<head>a</head>"), "");
}

TEST(NodeContent, StaysBelowItsNode) {
    const Document document = parse("<a><b>one<i>two</i></b>three</a>");
    const Ref<MutableString> output = MutableString::mutableString();
    _contentFromLibxml2Node(xmlDocGetRootElement(document.get())->children, output);
    EXPECT_EQ(output->utf8(), "one two ");
    _contentFromLibxml2Node(xmlDocGetRootElement(document.get())->last, output);
    EXPECT_EQ(output->utf8(), "one two three ");
    _contentFromLibxml2Node(nullptr, output);
    EXPECT_EQ(output->utf8(), "one two three ");
}

TEST(NodeContent, WalksAnyDepth) {
    constexpr int kDepth = 200000;
    const Document document(xmlNewDoc(nullptr), xmlFreeDoc);
    xmlNode* node = xmlNewNode(nullptr, reinterpret_cast<const xmlChar*>("a"));
    xmlDocSetRootElement(document.get(), node);
    for (int i = 0; i < kDepth; ++i) {
        node = xmlNewChild(node, nullptr, reinterpret_cast<const xmlChar*>("a"), nullptr);
    }
    xmlNodeAddContent(node, reinterpret_cast<const xmlChar*>("x"));
    const Ref<MutableString> output = MutableString::mutableString();
    _contentFromLibxml2Node(xmlDocGetRootElement(document.get()), output);
    EXPECT_EQ(output->utf8(), "x ");
}
