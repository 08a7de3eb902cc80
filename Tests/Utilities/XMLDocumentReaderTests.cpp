#include "Utilities/XMLDocumentReader.h"

#include "Foundation/UTF8.h"
#include "Support/LogCapture.h"
#include "Support/TempDir.h"
#include "Utilities/XMLTexts.h"

#include <gtest/gtest.h>

#include <string>

using namespace Foundation;
using namespace Orvane;

namespace {

/// What a document is read as, or why it is not.
std::string read(const std::string& xml, XMLTolerance tolerance) {
    std::string error;
    const Ref<XMLTree> tree = readXMLDocument(xml, tolerance, error);
    if (!tree) {
        EXPECT_NE(error, "");
        return "error: " + error;
    }
    const Ref<XMLElement> root = XMLElement::_wrapElement(tree, tree->root());
    return xmlOf(*root);
}

}  // namespace

TEST(XMLDocumentReader, RefusesWhatIsNoXMLUnlessItMayMend) {
    EXPECT_EQ(read("<a><b>x</b></a>", XMLTolerance::None), "<a><b>x</b></a>");
    EXPECT_TRUE(read("<a><b>x</a>", XMLTolerance::None).starts_with("error: Opening and ending"));
    EXPECT_EQ(read("<a><b>x</a>", XMLTolerance::XML), "<a><b>x</b></a>");
    EXPECT_EQ(read("<a>x&nbsp;y & z</a>", XMLTolerance::XML), "<a>x\xC2\xA0y &amp; z</a>");
    EXPECT_EQ(read("<a t=\"&eacute;\"/>", XMLTolerance::XML), "<a t=\"\xC3\xA9\"/>");
}

TEST(XMLDocumentReader, SaysWhereADocumentIsWrong) {
    EXPECT_TRUE(read("<a>\n<b>\n</a>", XMLTolerance::None).ends_with("(line 3)"));
    EXPECT_EQ(read("", XMLTolerance::XMLOrHTML), "error: The document is empty");
}

TEST(XMLDocumentReader, RefusesMoreThanItsParserCanCount) {
    std::string error;
    const std::string_view much("<a/>", (256u << 20) + 1);  // never looked at
    EXPECT_EQ(readXMLDocument(much, XMLTolerance::XMLOrHTML, error).get(), nullptr);
    EXPECT_EQ(error, "The document is too large");
}

TEST(XMLDocumentReader, ReadsPagesAsXHTML) {
    const std::string page = "<HTML><body><p>one<br>two</body></HTML>";
    EXPECT_EQ(
        read(page, XMLTolerance::XMLOrHTML),
        "<html xmlns=\"http://www.w3.org/1999/xhtml\"><body><p>one<br/>two</p></body></html>");
    EXPECT_EQ(read(page, XMLTolerance::XML), "<HTML><body><p>one<br>two</br></p></body></HTML>");
    EXPECT_EQ(read("only text", XMLTolerance::XMLOrHTML),
              "<html xmlns=\"http://www.w3.org/1999/xhtml\"><body><p>only text</p></body></html>");
    EXPECT_TRUE(read("only text", XMLTolerance::XML).starts_with("error: "));
}

TEST(XMLDocumentReader, ReadsBrokenFeedsAsXMLEvenWhereHTMLIsAllowed) {
    EXPECT_EQ(read("<rss><channel><link>x</channel></rss>", XMLTolerance::XMLOrHTML),
              "<rss><channel><link>x</link></channel></rss>");
}

TEST(XMLDocumentReader, ReadsHTMLAsUTF8WhereItIs) {
    EXPECT_NE(read("<p>caf\xC3\xA9</p>", XMLTolerance::HTML).find("caf\xC3\xA9"),
              std::string::npos);
    EXPECT_NE(read("<p>caf\xE9</p>", XMLTolerance::HTML).find("caf\xC3\xA9"), std::string::npos);
}

TEST(XMLDocumentReader, ReadsHTMLInTheEncodingThatItNames) {
    EXPECT_NE(read("<meta charset='iso-8859-5'><p>\xD0</p>", XMLTolerance::HTML).find("\xD0\xB0"),
              std::string::npos);
    // Where it names none, libxml2 by itself leaves half a character in the tree.
    const std::string page = read("<?xm.0\"?><!\"?><!rn><?\xEF]", XMLTolerance::HTML);
    EXPECT_TRUE(UTF8::isValid(page)) << page;
}

TEST(XMLDocumentReader, WritesTheNamespaceOfAPageOnce) {
    const std::string page =
        "<html xmlns='http://www.w3.org/1999/xhtml'><body><p xmlns='x'>a<br></body></html>";
    EXPECT_EQ(read(page, XMLTolerance::HTML),
              "<html xmlns=\"http://www.w3.org/1999/xhtml\"><body><p>a<br/></p></body></html>");
}

TEST(XMLDocumentReader, MendsWhatIsNotInItsEncoding) {
    EXPECT_EQ(read("<a b='\xE9'>caf\xE9 \xC3\xA9</a>", XMLTolerance::XML),
              "<a b=\"\xC3\xA9\">caf\xC3\xA9 \xC3\xA9</a>");
    EXPECT_EQ(read("<?xml version='1.0' encoding='UTF-8'?><a>\xE9</a>", XMLTolerance::XML),
              "<a>\xC3\xA9</a>");
    EXPECT_EQ(read("<?xml version='1.0' encoding='iso-8859-1'?><a>\xC3\xA9</b>", XMLTolerance::XML),
              "<a>\xC3\x83\xC2\xA9</a>");
    EXPECT_EQ(read(std::string("\xFF\xFE<\0a\0>\0\xE9\0", 10), XMLTolerance::XML),
              "<a>\xC3\xA9</a>");
    EXPECT_EQ(read(std::string("<a>\x01x\0y</a>", 11), XMLTolerance::XML), "<a>xy</a>");
}

TEST(XMLDocumentReader, LeavesNothingThatCouldNotBeReadAgain) {
    EXPECT_EQ(read("<a><?xml version='1.0'?><b></a>", XMLTolerance::XML), "<a><b/></a>");
    EXPECT_EQ(read("<p>x<!-- a -- b --><!--c--->y<!--z--></p>", XMLTolerance::HTML),
              "<html xmlns=\"http://www.w3.org/1999/xhtml\"><body><p>xy<!--z--></p></body></html>");
    EXPECT_EQ(
        read("<div><p:8>x</p:8></div>", XMLTolerance::HTML),
        "<html xmlns=\"http://www.w3.org/1999/xhtml\"><body><div><_8>x</_8></div></body></html>");
    EXPECT_EQ(read(std::string("\xFF\xFE<\0p\0>\0\x01\0x\0", 12), XMLTolerance::HTML),
              "<html xmlns=\"http://www.w3.org/1999/xhtml\"><body><p>x</p></body></html>");
    EXPECT_EQ(read("<p .x='1' y='2'>\x02</p>", XMLTolerance::HTML),
              "<html xmlns=\"http://www.w3.org/1999/xhtml\"><body><p y=\"2\"/></body></html>");
    EXPECT_EQ(
        read("<p a:b='1' a:b:02c='2'>x</p>", XMLTolerance::HTML),
        "<html xmlns=\"http://www.w3.org/1999/xhtml\"><body><p a:b=\"1\">x</p></body></html>");
}

TEST(XMLDocumentReader, LeavesEachAttributeOnce) {
    EXPECT_EQ(read("<a><p:b c='&amp;x;' c='&amp;x;' d='1'>x</b></a>", XMLTolerance::XML),
              "<a><p:b c=\"&amp;x;\" d=\"1\">x</p:b></a>");
    EXPECT_EQ(read("<a xmlns:p='u' c='1' p:c='2'>x", XMLTolerance::XML),
              "<a xmlns:p=\"u\" c=\"1\" p:c=\"2\">x</a>");
}

TEST(XMLDocumentReader, ReplacesTheDocumentsOwnEntities) {
    EXPECT_EQ(read("<!DOCTYPE a [<!ENTITY x 'y'>]><a b='&x;'>&x;</a>", XMLTolerance::None),
              "<a b=\"y\">y</a>");
}

TEST(XMLDocumentReader, OpensNoFiles) {
    const Support::TempDir directory;
    const std::string path = directory.writeFile("secret", "<secret/>");
    const std::string name = "\"file://" + path + "\"";
    for (const std::string& document : {"<!DOCTYPE a [<!ENTITY x SYSTEM " + name + ">]><a>&x;</a>",
                                        "<!DOCTYPE a [<!ENTITY % x SYSTEM " + name + "> %x;]><a/>",
                                        "<!DOCTYPE a SYSTEM " + name + "><a/>"}) {
        for (const XMLTolerance tolerance :
             {XMLTolerance::None, XMLTolerance::XML, XMLTolerance::XMLOrHTML, XMLTolerance::HTML}) {
            EXPECT_EQ(read(document, tolerance).find("<secret"), std::string::npos) << document;
        }
    }
}

TEST(XMLDocumentReader, BoundsWhatEntitiesGrowTo) {
    std::string laughs = "<!DOCTYPE a [<!ENTITY l0 'laughlaughlaugh'>";
    std::string parameters = "<!DOCTYPE a [<!ENTITY % p0 '<!ENTITY x \"y\">'>";
    for (int i = 1; i < 10; ++i) {
        const std::string name = std::to_string(i - 1);
        laughs += "<!ENTITY l" + std::to_string(i) + " '";
        parameters += "<!ENTITY % p" + std::to_string(i) + " '";
        for (int j = 0; j < 10; ++j) {
            laughs += "&l" + name + ";";
            parameters += "&#37;p" + name + ";";
        }
        laughs += "'>";
        parameters += "'>";
    }
    laughs += "]><a b='&l9;'>&l9;</a>";
    parameters += "%p9;]><a/>";
    for (const std::string& document : {laughs, parameters}) {
        for (const XMLTolerance tolerance :
             {XMLTolerance::None, XMLTolerance::XML, XMLTolerance::XMLOrHTML}) {
            EXPECT_LT(read(document, tolerance).size(), 20u << 20);
        }
    }
}

TEST(XMLDocumentReader, GivesADocumentOfCountlessFaultsUp) {
    const Support::LogCapture log;
    const Support::LoggingOn logging({&gLogParser});
    std::string faults = "<a>";
    for (int i = 0; i < 20000; ++i) {
        faults += "<b c=d/>";
    }
    read(faults + "</a>", XMLTolerance::XML);
    EXPECT_TRUE(log.contains("An XML document has 10000 faults and is given up"));
}

TEST(XMLDocumentReader, SurvivesDepth) {
    std::string deep;
    for (int i = 0; i < 100000; ++i) {
        deep += "<a>";
    }
    for (const XMLTolerance tolerance :
         {XMLTolerance::None, XMLTolerance::XML, XMLTolerance::XMLOrHTML, XMLTolerance::HTML}) {
        read(deep, tolerance);
    }
}
