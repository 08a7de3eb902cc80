#include "Utilities/XMLElement.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Support/DefaultZone.h"
#include "Support/LogCapture.h"
#include "Utilities/XMLTexts.h"

#include <gtest/gtest.h>

using namespace Foundation;
using namespace Orvane;

namespace {

const std::string kXHTML = XMLElement::kXHTMLNamespace;
const std::string kAtom = "http://www.w3.org/2005/Atom";

Ref<XMLElement> parseXHTML(const std::string& xhtml) {
    const Ref<Data> data = Data::adopt(xhtml);
    return XMLElement::ov_XHTMLElementWithData(data);
}

std::string textOf(StringReturner text) {
    const Ref<String> held(std::move(text));
    return held ? held->utf8() : "(null)";
}

/// The names of a list's elements, a blank between them.
std::string namesOf(Returner<XMLElement::Elements> elements) {
    const Ref<XMLElement::Elements> held(std::move(elements));
    std::string names;
    for (const XMLElement* element : *held.get()) {
        names += (names.empty() ? "" : " ") + textOf(element->getName());
    }
    return names;
}

}  // namespace

TEST(XMLElement, IsTheRootOfItsDocument) {
    EXPECT_EQ(xmlOf(*parse("<?xml version='1.0'?><!-- x --><a b='c'>d</a>")), "<a b=\"c\">d</a>");
    EXPECT_EQ(Ref<XMLElement>(XMLElement::ov_elementWithData(nullptr, true)).get(), nullptr);
}

TEST(XMLElement, IsReadWithMoreToleranceWhereHTMLIsAllowed) {
    const Support::LogCapture log;
    EXPECT_EQ(parse("no markup", false).get(), nullptr);
    EXPECT_TRUE(log.contains("Couldn't parse XML data, error='"));
    EXPECT_EQ(xmlOf(*parse("no markup", true)),
              "<html xmlns=\"" + kXHTML + "\"><body><p>no markup</p></body></html>");
    EXPECT_EQ(xmlOf(*parse("<html><br>x</html>", false)), "<html><br>x</br></html>");
    EXPECT_EQ(xmlOf(*parse("<html><br>x</html>", true)),
              "<html xmlns=\"" + kXHTML + "\"><body><br/>x</body></html>");
    EXPECT_EQ(parse("", true).get(), nullptr);
    EXPECT_EQ(log.count("Couldn't parse XML data, error='The document is empty'"), 1);
}

TEST(XMLElement, IsReadFromHTML) {
    const Ref<Data> data = Data::adopt("<p>a<b>c");
    const Ref<XMLElement> page = XMLElement::elementWithHTML(data);
    EXPECT_EQ(xmlOf(*page), "<html xmlns=\"" + kXHTML + "\"><body><p>a<b>c</b></p></body></html>");
    std::string error;
    const Ref<Data> none = Data::adopt("");
    EXPECT_EQ(Ref<XMLElement>(XMLElement::elementWithHTML(none, &error)).get(), nullptr);
    EXPECT_EQ(error, "The document is empty");
    EXPECT_EQ(Ref<XMLElement>(XMLElement::elementWithHTML(nullptr)).get(), nullptr);
}

TEST(XMLElement, OfXHTMLIsItsOneDiv) {
    const std::string div = "<div xmlns=\"" + kXHTML + "\"><p>a</p></div>";
    const Ref<XMLElement> element = parseXHTML(div);
    EXPECT_EQ(xmlOf(*element), div);
    EXPECT_EQ(Ref<XMLElement>(element->getParent()).get(), nullptr);
    EXPECT_EQ(xmlOf(*parseXHTML("<div><p>a</p></div>")), div) << "in the wrapper's namespace";
}

TEST(XMLElement, OfXHTMLIsWrappedUnlessItIsOneDiv) {
    const std::string open = "<div xmlns=\"" + kXHTML + "\">";
    EXPECT_EQ(xmlOf(*parseXHTML("<p>a</p><p>b</p>")), open + "<p>a</p><p>b</p></div>");
    EXPECT_EQ(xmlOf(*parseXHTML("<p>a</p>")), open + "<p>a</p></div>");
    EXPECT_EQ(xmlOf(*parseXHTML("<div/> ")), open + "<div/> </div>");
    EXPECT_EQ(xmlOf(*parseXHTML("<div xmlns='urn:x'/>")), open + "<div xmlns=\"urn:x\"/></div>");
    EXPECT_EQ(xmlOf(*parseXHTML("text")), open + "text</div>");
    EXPECT_EQ(xmlOf(*parseXHTML("")), "<div xmlns=\"" + kXHTML + "\"/>");
    EXPECT_EQ(xmlOf(*parseXHTML("a&nbsp;<b>c")), open + "a\xC2\xA0<b>c</b></div>");
}

TEST(XMLElement, OfXHTMLNeedsData) {
    const Support::LogCapture log;
    try {
        const Ref<XMLElement> none = XMLElement::ov_XHTMLElementWithData(nullptr);
        FAIL() << "should have thrown";
    } catch (const AssertionFailure& failure) {
        EXPECT_STREQ(failure.what(), "data");
    }
}

TEST(XMLElement, IsWrittenIndentedInUTF8) {
    const Ref<XMLElement> element = parse("<a><b/><c>caf\xC3\xA9 <i>x</i></c></a>");
    EXPECT_EQ(Ref<Data>(element->ov_asData())->view(),
              "<a>\n  <b/>\n  <c>caf\xC3\xA9 <i>x</i></c>\n</a>");
    EXPECT_EQ(textOf(element->ov_asDocumentString()),
              "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
              "<a>\n  <b/>\n  <c>caf\xC3\xA9 <i>x</i></c>\n</a>\n");
}

TEST(XMLElement, IsCompleteWhereItIsWritten) {
    const Ref<XMLElement> root =
        parse("<a xmlns='urn:d' xmlns:p='urn:p'><p:b q='1'><c/></p:b></a>");
    const Ref<XMLElement> b = firstElement(*root);
    EXPECT_EQ(xmlOf(*parse(std::string(Ref<Data>(b->ov_asData())->view()))),
              "<p:b xmlns:p=\"urn:p\" xmlns=\"urn:d\" q=\"1\">\n  <c/>\n</p:b>");
    EXPECT_EQ(xmlOf(*root), "<a xmlns=\"urn:d\" xmlns:p=\"urn:p\"><p:b q=\"1\"><c/></p:b></a>");
}

TEST(XMLElement, HasANameInANamespace) {
    const Ref<XMLElement> root = parse("<p:a xmlns:p='urn:p'><b/><q:c/></p:a>");
    EXPECT_EQ(textOf(root->getName()), "p:a");
    EXPECT_EQ(textOf(root->getLocalName()), "a");
    EXPECT_EQ(textOf(root->ov_namespace()), "urn:p");
    EXPECT_TRUE(root->ov_hasName("a", "urn:p"));
    EXPECT_FALSE(root->ov_hasName("a", nullptr));
    EXPECT_FALSE(root->ov_hasName("A", "urn:p"));
    EXPECT_FALSE(root->ov_hasName(nullptr, "urn:p"));
    const Ref<XMLElement> b = firstElement(*root);
    EXPECT_EQ(textOf(b->ov_namespace()), "(null)");
    EXPECT_TRUE(b->ov_hasName("b", nullptr));
    EXPECT_FALSE(b->ov_hasName("b", ""));
    const Ref<XMLElement::Elements> all = root->getElements();
    EXPECT_EQ(textOf(all->at(1)->getName()), "q:c") << "a prefix that stands for nothing";
    EXPECT_EQ(textOf(all->at(1)->getLocalName()), "c");
    EXPECT_EQ(textOf(all->at(1)->ov_namespace()), "(null)");
}

TEST(XMLElement, IsMadeInANamespace) {
    const Ref<XMLElement> plain = XMLElement::element("a");
    EXPECT_EQ(xmlOf(*plain), "<a/>");
    const Ref<XMLElement> atom = XMLElement::element("entry", kAtom);
    EXPECT_EQ(xmlOf(*atom), "<entry xmlns=\"" + kAtom + "\"/>");
    const Ref<XMLElement> prefixed = XMLElement::element("p:a", "urn:p");
    EXPECT_EQ(xmlOf(*prefixed), "<p:a xmlns:p=\"urn:p\"/>");
    const Support::LogCapture log;
    EXPECT_THROW(Ref<XMLElement>(XMLElement::element("")), AssertionFailure);
}

TEST(XMLElement, HasAttributes) {
    const Ref<XMLElement> element = parse("<a b='1' p:c='2' e='' xmlns:p='urn:p'/>");
    EXPECT_EQ(textOf(element->getAttribute("b")), "1");
    EXPECT_EQ(textOf(element->getAttribute("p:c")), "2");
    EXPECT_EQ(textOf(element->getAttribute("c")), "(null)");
    EXPECT_EQ(textOf(element->getAttribute("e")), "");
    element->setAttribute("b", "x<\"&\x01");
    element->setAttribute("p:c", "3");
    element->setAttribute("e", nullptr);
    element->setAttribute("none", nullptr);
    element->setAttribute("d", "4");
    EXPECT_EQ(xmlOf(*element), "<a xmlns:p=\"urn:p\" b=\"x&lt;&quot;&amp;\" p:c=\"3\" d=\"4\"/>");
}

TEST(XMLElement, IgnoresAttributesThatOnlyADTDGives) {
    const Ref<XMLElement> element = parse("<!DOCTYPE a [<!ATTLIST a b CDATA 'c'>]><a/>");
    EXPECT_EQ(textOf(element->getAttribute("b")), "(null)");
}

TEST(XMLElement, AddsChildrenInItsDefaultNamespace) {
    const Ref<XMLElement> entry = parse("<entry xmlns='" + kAtom + "' xmlns:p='urn:p'/>");
    const Ref<XMLElement> title = entry->ov_addChildWithName("title");
    EXPECT_EQ(textOf(title->ov_namespace()), kAtom);
    const Ref<XMLElement> other = entry->ov_addChildWithName("p:x");
    EXPECT_EQ(textOf(other->ov_namespace()), "urn:p");
    EXPECT_EQ(xmlOf(*entry),
              "<entry xmlns=\"" + kAtom + "\" xmlns:p=\"urn:p\"><title/><p:x/></entry>");
    const Ref<XMLElement> undeclared = entry->ov_addChildWithName("q:y");
    EXPECT_EQ(textOf(undeclared->getName()), "q:y");
    const Support::LogCapture log;
    EXPECT_THROW(Ref<XMLElement>(entry->ov_addChildWithName(nullptr)), AssertionFailure);
}

TEST(XMLElement, AddsNoChildForAnEmptyText) {
    const Ref<XMLElement> element = parse("<a/>");
    EXPECT_EQ(Ref<XMLElement>(element->ov_addChildWithName("b", "")).get(), nullptr);
    EXPECT_EQ(Ref<XMLElement>(element->ov_addChildWithName("b", nullptr)).get(), nullptr);
    EXPECT_EQ(xmlOf(*element), "<a/>");
    const Ref<XMLElement> child = element->ov_addChildWithName("b", "x & <y>\x02");
    EXPECT_EQ(xmlOf(*child), "<b>x &amp; &lt;y&gt;</b>");
    EXPECT_EQ(xmlOf(*element), "<a><b>x &amp; &lt;y&gt;</b></a>");
}

TEST(XMLElement, AddsDatesByACalendarFormat) {
    const AutoreleasePool pool;
    const Support::DefaultZone zone("Europe/Berlin");
    const Ref<XMLElement> element = parse("<a/>");
    const Ref<Date> date = Date::date(151545600.75);  // 2005-10-21 00:00:00 GMT
    const Ref<XMLElement> child =
        element->ov_addChildWithName("b", date, "%a %d %b %Y %H:%M:%S %z");
    EXPECT_EQ(xmlOf(*child), "<b>Fri 21 Oct 2005 02:00:00 +0200</b>");
    EXPECT_EQ(Ref<XMLElement>(element->ov_addChildWithName("b", nullptr, "%Y")).get(), nullptr);
    EXPECT_EQ(Ref<XMLElement>(element->ov_addChildWithName("b", date, "")).get(), nullptr);
    const std::string longFormat(500, 'x');
    const Ref<XMLElement> longChild = element->ov_addChildWithName("b", date, longFormat);
    EXPECT_EQ(textOf(longChild->getStringValue()), longFormat);
    EXPECT_EQ(element->getChildCount(), 2u);
}

TEST(XMLElement, AddsDatesByAFormatter) {
    const AutoreleasePool pool;
    const Ref<XMLElement> element = parse("<a/>");
    const Ref<Date> date = Date::date(151545600);
    const Ref<DateFormatter> format = DateFormatter::fixedInGMT("yyyy-MM-dd");
    const Ref<XMLElement> child = element->ov_addChildWithName("b", date, format);
    EXPECT_EQ(xmlOf(*child), "<b>2005-10-21</b>");
    const Date* none = nullptr;
    EXPECT_EQ(Ref<XMLElement>(element->ov_addChildWithName("b", none, format)).get(), nullptr);
}

TEST(XMLElement, AddsLinks) {
    const Ref<String> text = String::string("http://a/b?c&d");
    const Ref<URL> url = URL::url(text);
    const Ref<XMLElement> element = parse("<a/>");
    const Ref<XMLElement> whole =
        element->ov_addLinkTo(url, "enclosure", "audio/mpeg", 18446744073709551615u);
    EXPECT_EQ(xmlOf(*whole),
              "<link rel=\"enclosure\" type=\"audio/mpeg\" "
              "href=\"http://a/b?c&amp;d\" length=\"18446744073709551615\"/>");
    const Ref<XMLElement> shorter = element->ov_addLinkTo(url, "alternate", "");
    EXPECT_EQ(xmlOf(*shorter), "<link rel=\"alternate\" href=\"http://a/b?c&amp;d\"/>");
    EXPECT_EQ(Ref<XMLElement>(element->ov_addLinkTo(nullptr, "alternate", "x", 1)).get(), nullptr);
    EXPECT_EQ(element->getChildCount(), 2u);
}

TEST(XMLElement, AddsCopiesOfNodes) {
    const Ref<XMLElement> entry = parse("<entry xmlns='" + kAtom + "'/>");
    const Ref<XMLElement> title = XMLElement::element("title", kAtom);
    title->addText("x");
    const Ref<XMLNode> added = entry->addChild(title);
    EXPECT_EQ(xmlOf(*entry), "<entry xmlns=\"" + kAtom + "\"><title>x</title></entry>");
    EXPECT_FALSE(added->isEqual(title));
    title->setAttribute("a", "b");
    const Ref<XMLElement> content = parseXHTML("<p>a</p>");
    const Ref<XMLNode> div = entry->addChild(content);
    EXPECT_EQ(xmlOf(*entry), "<entry xmlns=\"" + kAtom + "\"><title>x</title><div xmlns=\"" +
                                 kXHTML + "\"><p>a</p></div></entry>");
    EXPECT_EQ(Ref<XMLNode>(entry->addChild(nullptr)).get(), nullptr);
}

TEST(XMLElement, JoinsTextsThatStandSideBySide) {
    const Ref<XMLElement> element = parse("<a>x</a>");
    const Ref<XMLNode> text = XMLNode::text("y");
    const Ref<XMLNode> added = element->addChild(text);
    EXPECT_EQ(textOf(added->getStringValue()), "xy");
    element->addText("z");
    element->addText("");
    element->addText(nullptr);
    EXPECT_EQ(element->getChildCount(), 1u);
    EXPECT_EQ(xmlOf(*element), "<a>xyz</a>");
}

TEST(XMLElement, ListsItsChildren) {
    const Ref<XMLElement> root = parse("<a>t<b/><!--c--><p:b xmlns:p='urn:p'/><b><b/></b></a>");
    EXPECT_EQ(root->getChildCount(), 5u);
    const Ref<XMLElement::Children> children = root->getChildren();
    EXPECT_EQ(children->count(), 5u);
    EXPECT_EQ(children->at(0)->getKind(), XMLNode::Kind::Text);
    EXPECT_EQ(children->at(1)->getKind(), XMLNode::Kind::Element);
    EXPECT_EQ(children->at(2)->getKind(), XMLNode::Kind::Other);
    EXPECT_NE(dynamic_cast<XMLElement*>(children->at(1)), nullptr);
    EXPECT_EQ(namesOf(root->getElements()), "b p:b b");
    EXPECT_EQ(namesOf(root->getElements("b", nullptr)), "b b");
    EXPECT_EQ(namesOf(root->getElements("b", "urn:p")), "p:b");
}

TEST(XMLElement, TellsChildrenByNamespace) {
    const Ref<XMLElement> root =
        parse("<a xmlns:p='urn:p' xmlns:q='urn:q'>t<b/><p:c/><q:d/><p:e/></a>");
    EXPECT_EQ(namesOf(root->ov_childrenWithNamespace("urn:p")), "p:c p:e");
    EXPECT_EQ(namesOf(root->ov_childrenWithoutNamespace("urn:p")), "q:d");
    EXPECT_EQ(namesOf(root->ov_childrenWithNamespace(nullptr)), "");
    EXPECT_EQ(namesOf(root->ov_childrenWithoutNamespace(nullptr)), "p:c q:d p:e");
}

TEST(XMLElement, RemovesChildrenByName) {
    const Ref<XMLElement> root = parse("<a xmlns:p='urn:p'><b/>t<p:b/><c/><b><b/></b></a>");
    root->ov_removeChildrenWithLocalName("b", nullptr);
    EXPECT_EQ(xmlOf(*root), "<a xmlns:p=\"urn:p\">t<p:b/><c/></a>");
    root->ov_removeChildrenWithLocalName("b", "urn:p");
    EXPECT_EQ(xmlOf(*root), "<a xmlns:p=\"urn:p\">t<c/></a>");
}

TEST(XMLElement, RemovesChildrenByAttribute) {
    const std::string all = "<a><b/><b r='x'/><b r='Y'/><b r=''/><c r='y'/></a>";
    const Ref<XMLElement> byValue = parse(all);
    byValue->ov_removeChildrenWithLocalName("b", nullptr, "r", "y");
    EXPECT_EQ(xmlOf(*byValue), "<a><b r=\"x\"/><b r=\"\"/><c r=\"y\"/></a>");
    const Ref<XMLElement> withoutValue = parse(all);
    withoutValue->ov_removeChildrenWithLocalName("b", nullptr, "r", nullptr);
    EXPECT_EQ(xmlOf(*withoutValue), "<a><b r=\"x\"/><b r=\"Y\"/><b r=\"\"/><c r=\"y\"/></a>");
    const Ref<XMLElement> withoutAttribute = parse(all);
    withoutAttribute->ov_removeChildrenWithLocalName("b", nullptr, nullptr, "x");
    EXPECT_EQ(xmlOf(*withoutAttribute), "<a><c r=\"y\"/></a>");
}
