#include "Foundation/PropertyList.h"

#include "Foundation/ArrayOf.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/DictionaryOf.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/Number.h"
#include "Foundation/String.h"

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <limits>

using namespace Foundation;

namespace {

using List = MutableArrayOf<PFRefCounted>;

std::string document(const std::string& value) {
    return "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<plist version=\"1.0\">" + value +
           "</plist>";
}

/// The value, and the error in its place if there is one.
std::string describeXML(const std::string& xml) {
    std::string error = "left as it was";
    const Ref<PFRefCounted> value = PropertyList::read(Bytes(xml), &error);
    if (!error.empty()) return "error: " + error;
    return OVFormat("%@", value);
}
std::string describe(const std::string& value) {
    return describeXML(document(value));
}
bool isRefused(const std::string& value) {
    const std::string xml = document(value);
    const Ref<PFRefCounted> read = PropertyList::read(Bytes(xml));
    return !read && describe(value).starts_with("error: ");
}

std::string xmlOf(const PFRefCounted* value) {
    std::string error = "left as it was";
    const Ref<Data> xml = PropertyList::write(value, &error);
    return xml ? std::string(xml->view()) : "error: " + error;
}

/// What comes back when a value is written and read.
Ref<PFRefCounted> throughXML(const PFRefCounted* value) {
    const Ref<Data> xml = PropertyList::write(value);
    return xml ? Ref<PFRefCounted>(PropertyList::read(xml->asBytes())) : Ref<PFRefCounted>();
}

void expectKept(const PFRefCounted* value) {
    EXPECT_TRUE(IsEqual(throughXML(value).get(), value)) << OVFormat("%@", value);
}

String* text(const char* utf8) {
    return String::string(utf8);
}
Number* number(auto value) {
    return Number::number(value);
}

}  // namespace

TEST(PropertyList, WritesEveryKindOfValue) {
    const AutoreleasePool pool;
    const Ref<MutableDictionary> tree = MutableDictionary::dictionary();
    tree->set("text", text("a<b>&\"c'"));
    tree->set("yes", number(true));
    tree->set("no", number(false));
    tree->set("integer", number(-42));
    tree->set("real", number(0.1));
    tree->set("data", Data::data("\0\1", 2));
    tree->set("date", Date::date(151546354.75));
    tree->set("array", List::array({text("x"), static_cast<List*>(List::array())}));
    tree->set("dictionary", MutableDictionary::dictionary());
    EXPECT_EQ(xmlOf(tree), R"(<?xml version="1.0" encoding="UTF-8"?>
<plist version="1.0">
<dict>
	<key>text</key>
	<string>a&lt;b&gt;&amp;"c'</string>
	<key>yes</key>
	<true/>
	<key>no</key>
	<false/>
	<key>integer</key>
	<integer>-42</integer>
	<key>real</key>
	<real>0.1</real>
	<key>data</key>
	<data>AAE=</data>
	<key>date</key>
	<date>2005-10-21T00:12:34Z</date>
	<key>array</key>
	<array>
		<string>x</string>
		<array>
		</array>
	</array>
	<key>dictionary</key>
	<dict>
	</dict>
</dict>
</plist>
)");
}

TEST(PropertyList, KeepsNumbersAndTheirKinds) {
    const AutoreleasePool pool;
    for (Number* value : {number(INT64_MIN), number(INT64_MAX), number(-1), number(0), number(true),
                          number(false), number(0.1), number(3.0), number(1e-300), number(-1e300),
                          number(5e-324), number(std::numeric_limits<double>::infinity()),
                          number(-std::numeric_limits<double>::infinity()), number(std::nan(""))}) {
        expectKept(value);
        EXPECT_EQ(static_cast<Number*>(throughXML(value).get())->getKind(), value->getKind());
    }
}

TEST(PropertyList, KeepsTexts) {
    const AutoreleasePool pool;
    for (const char* utf8 : {"", " ", "  a b\t\n ", "line\r\nline\rline\n", "]]>", "<![CDATA[x]]>",
                             "&amp;", "\xC3\xA9\xF0\x9F\x98\x80", "\x7F\xC2\x85\xE2\x80\xA8"}) {
        expectKept(text(utf8));
        expectKept(
            Ref<Dictionary>(MutableDictionary::dictionary({{text(utf8), text(utf8)}})).get());
    }
}

TEST(PropertyList, KeepsEmptyContainersAndOrder) {
    const AutoreleasePool pool;
    expectKept(Ref<List>(List::array()).get());
    expectKept(Ref<Data>(Data::data(nullptr, 0)).get());
    const Ref<MutableDictionary> tree = MutableDictionary::dictionary();
    EXPECT_EQ(OVFormat("%@", throughXML(tree)), "{}");
    for (const char* key : {"z", "a", "m"}) {
        tree->set(key, number(1));
    }
    EXPECT_EQ(OVFormat("%@", throughXML(tree)), "{z = 1, a = 1, m = 1}");
}

TEST(PropertyList, GivesContainersThatCanBeChanged) {
    const AutoreleasePool pool;
    const std::string xml = document("<dict><key>a</key><array/></dict>");
    const Ref<PFRefCounted> value = PropertyList::read(Bytes(xml));
    auto* tree = dynamic_cast<MutableDictionary*>(value.get());
    ASSERT_NE(tree, nullptr);
    auto* array = tree->getAs<List>("a");
    ASSERT_NE(array, nullptr);
    array->add(text("x"));
    EXPECT_EQ(OVFormat("%@", tree), "{a = (x)}");
}

TEST(PropertyList, KeepsDatesOfFourDigitYearsInWholeSeconds) {
    const AutoreleasePool pool;
    for (const double time : {1.0, -1.0, 151546354.0, 4e9, -4e9, -63113904000.0, 252423993599.0}) {
        expectKept(Ref<Date>(Date::date(time)).get());
    }
    const Ref<Date> date = Date::date(-1.25);
    EXPECT_EQ(static_cast<Date*>(throughXML(date).get())->getAbsoluteTime(), -2.0);
}

TEST(PropertyList, RefusesDatesOfOtherYears) {
    EXPECT_EQ(xmlOf(Ref<Date>(Date::date(252423993600.0)).get()),
              "error: the date 10000-01-01 00:00:00 +0000 is out of range");
    EXPECT_TRUE(xmlOf(Ref<Date>(Date::date(-63113904001.0)).get()).starts_with("error: "));
    EXPECT_TRUE(xmlOf(Ref<Date>(Date::date(-1e300)).get()).starts_with("error: "));
}

TEST(PropertyList, ReadsTheStartOf2001AsNoDate) {
    EXPECT_EQ(describe("<date>2001-01-01T00:00:00Z</date>"), "(null)");
    EXPECT_EQ(describe("<dict><key>a</key><date>2001-01-01T00:00:00Z</date>"
                       "<key>b</key><true/></dict>"),
              "{b = 1}");
    EXPECT_EQ(describe("<array><date>2001-01-01T00:00:00Z</date></array>"), "((null))");
}

TEST(PropertyList, ReadsWhatOthersWrite) {
    EXPECT_EQ(describe("<integer> +42\n</integer>"), "42");
    EXPECT_EQ(describe("<integer>0x1F</integer>"), "31");
    EXPECT_EQ(describe("<integer>-0x8000000000000000</integer>"), "-9223372036854775808");
    EXPECT_EQ(describe("<real>+1.50E+2</real>"), "150");
    EXPECT_EQ(describe("<real>.5</real>"), "0.5");
    EXPECT_EQ(describe("<data>\n\tAA\n\tE=\n</data>"), "<0001>");
    EXPECT_EQ(describe("<true></true>"), "1");
    EXPECT_EQ(describe("<string>a&#233;&#x1F600;<![CDATA[<b>]]><!-- not --></string>"),
              "a\xC3\xA9\xF0\x9F\x98\x80<b>");
    EXPECT_EQ(describe("<!-- first --> <array> <!-- second --> <true/> </array> "), "(1)");
    EXPECT_EQ(
        describeXML("\xEF\xBB\xBF<!DOCTYPE plist SYSTEM \"some.dtd\"><plist><false/></plist>"),
        "0");
}

TEST(PropertyList, TakesTheLastOfEqualKeys) {
    EXPECT_EQ(describe("<dict><key>a</key><true/><key>a</key><string>x</string></dict>"),
              "{a = x}");
}

TEST(PropertyList, SaysWhatIsWrongAndWhere) {
    EXPECT_EQ(describe("\n<dict>\n<true/></dict>"), "error: line 4: a value without a key");
    EXPECT_EQ(describe("<integer>12x</integer>"),
              "error: line 2: not an integer of 64 bits: \"12x\"");
    EXPECT_EQ(describe("<real>0,5</real>"), "error: line 2: not a real number: \"0,5\"");
    EXPECT_EQ(describe("<date>yesterday</date>"), "error: line 2: not a date: \"yesterday\"");
    EXPECT_EQ(describe(""), "error: line 2: the plist element is empty");
    EXPECT_EQ(describeXML("<html/>"), "error: line 1: the root element is not plist");
    EXPECT_NE(describeXML("<plist><array>").find("line 1"), std::string::npos);
}

class PropertyListRefusals : public testing::TestWithParam<const char*> {};

TEST_P(PropertyListRefusals, AreErrors) {
    EXPECT_TRUE(isRefused(GetParam())) << describe(GetParam());
}

INSTANTIATE_TEST_SUITE_P(OfStructure, PropertyListRefusals,
                         testing::Values("<true/><true/>", "<key>a</key>",
                                         "<array><key>a</key></array>", "<dict><key>a</key></dict>",
                                         "<dict><key>a</key><key>b</key><true/></dict>",
                                         "<dict><true/></dict>", "<array>x</array>", "x",
                                         "<string><b/></string>", "<string><true/></string>",
                                         "<unknown/>", "<plist/>", "<array></dict>", "<array>",
                                         "</array>", "<string>&unknown;</string>",
                                         "<string>\xFF\xFE</string>", "<string>&#0;</string>",
                                         "<string>&#xD800;</string>"));

INSTANTIATE_TEST_SUITE_P(
    OfScalars, PropertyListRefusals,
    testing::Values("<integer></integer>", "<integer>abc</integer>", "<integer>--1</integer>",
                    "<integer>+-1</integer>", "<integer>0x</integer>", "<integer>-0x-1</integer>",
                    "<integer>1.5</integer>", "<integer>9223372036854775808</integer>",
                    "<integer>99999999999999999999999</integer>", "<real></real>",
                    "<real>1e999</real>", "<real>0x10</real>", "<date></date>",
                    "<date>2005-13-01T00:00:00Z</date>", "<date>2005-00-01T00:00:00Z</date>",
                    "<date>2005-01-32T00:00:00Z</date>", "<date>2005-01-01T24:00:00Z</date>",
                    "<date>2005-01-01T00:60:00Z</date>", "<date>2005-01-01T00:00:61Z</date>",
                    "<date>2005-01-01 00:00:00Z</date>", "<date>2005-01-01T00:00:00</date>",
                    "<date>-005-01-01T00:00:00Z</date>"));

TEST(PropertyList, RefusesWhatIsNoXML) {
    for (const std::string& bytes :
         {std::string(), std::string("bplist00"), std::string("{ a = 1; }"), std::string(10, '\0'),
          std::string("<plist>") + '\0', std::string("\xFF\xFE<\0p\0", 6)}) {
        EXPECT_TRUE(describeXML(bytes).starts_with("error: ")) << bytes;
    }
    for (const char* xml : {"<plist/><true/>", "<plist><true/></plist><true/>",
                            "<plist><true/></plist><plist/>", "<!-- nothing -->"}) {
        EXPECT_TRUE(describeXML(xml).starts_with("error: ")) << describeXML(xml);
    }
    std::string error;
    const Ref<PFRefCounted> nothing = PropertyList::read(Bytes(), &error);
    EXPECT_FALSE(nothing);
    EXPECT_EQ(error, "there is no text");
}

TEST(PropertyList, ExpandsNoEntities) {
    std::string xml = "<!DOCTYPE plist [<!ENTITY a0 \"ha\">";
    for (int i = 1; i < 30; ++i) {
        xml += OVFormat("<!ENTITY a%d \"&a%d;&a%d;\">", i, i - 1, i - 1);
    }
    xml += "]><plist><string>&a29;</string></plist>";
    EXPECT_TRUE(describeXML(xml).starts_with("error: "));
    EXPECT_TRUE(describeXML("<!DOCTYPE plist [<!ENTITY a SYSTEM \"file:///etc/passwd\">]>"
                            "<plist><string>&a;</string></plist>")
                    .starts_with("error: "));
}

TEST(PropertyList, LimitsTheDepth) {
    const auto nested = [](std::size_t depth) {
        std::string value;
        for (std::size_t i = 0; i < depth; ++i) {
            value += "<array>";
        }
        for (std::size_t i = 0; i < depth; ++i) {
            value += "</array>";
        }
        return document(value);
    };
    const std::string deepest = nested(PropertyList::kMaxDepth);
    const Ref<PFRefCounted> value = PropertyList::read(Bytes(deepest));
    ASSERT_TRUE(value);
    expectKept(value.get());
    EXPECT_EQ(describeXML(nested(PropertyList::kMaxDepth + 1)), "error: line 2: too deep");
    EXPECT_EQ(describeXML(nested(1000000)), "error: line 2: too deep");
}

TEST(PropertyList, RefusesToWriteATreeWithoutEnd) {
    const AutoreleasePool pool;
    const Ref<List> array = List::array();
    array->add(array);
    EXPECT_EQ(xmlOf(array), "error: too deep");
    array->removeAll();
}

TEST(PropertyList, RefusesToWriteWhatXMLCannotHold) {
    const AutoreleasePool pool;
    EXPECT_EQ(xmlOf(text("a\x01"
                         "b")),
              "error: a text holds a character that XML cannot hold: \"a\" and then it");
    const Ref<String> zero = String::string(std::string("a\0b", 3));
    EXPECT_TRUE(xmlOf(zero).starts_with("error: "));
    EXPECT_TRUE(xmlOf(text("\x1F")).starts_with("error: "));
    EXPECT_TRUE(xmlOf(text("\xEF\xBF\xBE")).starts_with("error: "));
    EXPECT_TRUE(xmlOf(text("\xEF\xBF\xBF")).starts_with("error: "));
    expectKept(text("\xEF\xBF\xBD \t"));
}

TEST(PropertyList, RefusesToWriteOtherValues) {
    const AutoreleasePool pool;
    class Other : public PFRefCounted {};
    const Ref<Other> other = Returner<Other>(new Other);
    EXPECT_TRUE(xmlOf(other).ends_with("cannot be written")) << xmlOf(other);
    EXPECT_EQ(xmlOf(nullptr), "error: null cannot be written");
    EXPECT_EQ(xmlOf(Ref<List>(List::array({nullptr})).get()), "error: null cannot be written");
    using ByNumber = MutableDictionaryOf<Number, String>;
    EXPECT_EQ(xmlOf(Ref<ByNumber>(ByNumber::dictionary({{number(1), text("x")}})).get()),
              "error: the key 1 is no string");
}

TEST(PropertyList, NeedsNoPool) {
    const std::string xml = document("<dict><key>a</key><array><true/><data/></array></dict>");
    Ref<Data> back;
    {
        const Ref<PFRefCounted> value = PropertyList::read(Bytes(xml));
        back = PropertyList::write(value.get());
    }
    EXPECT_GT(back->getLength(), 0u);
}
