#include "Utilities/XMLMending.h"

#include <gtest/gtest.h>

#include <string>

using namespace Orvane;

namespace {

struct Mending {
    const char* document;
    const char* mended;
};

class MendedReferences : public testing::TestWithParam<Mending> {};

}  // namespace

TEST_P(MendedReferences, AreThoseThatXMLKnows) {
    EXPECT_EQ(mendReferences(GetParam().document), GetParam().mended);
}

INSTANTIATE_TEST_SUITE_P(
    XMLMending, MendedReferences,
    testing::Values(Mending{"", ""}, Mending{"<a>b</a>", "<a>b</a>"},
                    Mending{"&amp;&lt;&gt;&quot;&apos;", "&amp;&lt;&gt;&quot;&apos;"},
                    Mending{"&nbsp;&eacute;&Eacute;", "&#160;&#233;&#201;"},
                    Mending{"&foo;", "&amp;foo;"}, Mending{"a & b", "a &amp; b"},
                    Mending{"&", "&amp;"}, Mending{"&;", "&amp;;"}, Mending{"&amp", "&amp;amp"},
                    Mending{"?a=1&b=2", "?a=1&amp;b=2"}, Mending{"&#65;&#x1F;", "&#65;&#x1F;"},
                    Mending{"&#;&#x;&#xg;&#6a;", "&amp;#;&amp;#x;&amp;#xg;&amp;#6a;"},
                    Mending{"&#6", "&amp;#6"},
                    Mending{"<![CDATA[&nbsp;]]>&nbsp;", "<![CDATA[&nbsp;]]>&#160;"},
                    Mending{"<!--&nbsp;-->&nbsp;<!--&", "<!--&nbsp;-->&#160;<!--&"},
                    Mending{"<!ENTITY x 'y'>&x;&", "<!ENTITY x 'y'>&x;&amp;"}));

TEST(XMLMending, ReadsStrayBytesAsLatin1) {
    EXPECT_EQ(mendXML("caf\xE9 caf\xC3\xA9"), "caf\xC3\xA9 caf\xC3\xA9");
    EXPECT_EQ(mendXML("\xC3"), "\xC3\x83");
    const std::string other = "<?xml version='1.0' encoding='iso-8859-1'?>\xE9";
    EXPECT_EQ(mendXML(other), other);
    EXPECT_EQ(mendXML("<?xml version='1.0' encoding='Utf-8'?>\xE9"),
              "<?xml version='1.0' encoding='Utf-8'?>\xC3\xA9");
}

TEST(XMLMending, LeavesAloneWhatItCannotLookInto) {
    const std::string wide("\xFE\xFF\0&\0\x01", 6);
    EXPECT_TRUE(isWideXML(wide));
    EXPECT_EQ(mendXML(wide), wide);
    const std::string escapes = "<?xml version='1.0' encoding='iso-2022-jp'?>\x1B$B&\"\x1B(B";
    EXPECT_EQ(mendXML(escapes), escapes);
    EXPECT_FALSE(isWideXML("<a/>"));
    EXPECT_FALSE(isWideXML(""));
}

TEST(XMLMending, LeavesOutControlCharacters) {
    EXPECT_EQ(mendXML(std::string_view("<a\0b\x01\tc\x1B", 8)), "<ab\tc");
}
