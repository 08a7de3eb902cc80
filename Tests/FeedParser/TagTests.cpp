#include "FeedParser/Tag.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <set>
#include <string>

using namespace Orvane::FeedParser;

namespace {

struct Name {
    const char* text;
    Tag tag;
    const char* tagName;
};

constexpr Name kNames[] = {
    Name{"application/xhtml+xml", ApplicationXHTMLXMLTag, "ApplicationXHTMLXMLTag"},
    Name{"issued", IssuedTag, "IssuedTag"},
    Name{"author", AuthorTag, "AuthorTag"},
    Name{"item", ItemTag, "ItemTag"},
    Name{"base", BaseTag, "BaseTag"},
    Name{"knows", KnowsTag, "KnowsTag"},
    Name{"base64", Base64Tag, "Base64Tag"},
    Name{"lastbuilddate", LastBuildDateTag, "LastBuildDateTag"},
    Name{"channel", ChannelTag, "ChannelTag"},
    Name{"length", LengthTag, "LengthTag"},
    Name{"content", ContentTag, "ContentTag"},
    Name{"link", LinkTag, "LinkTag"},
    Name{"contributor", ContributorTag, "ContributorTag"},
    Name{"logo", LogoTag, "LogoTag"},
    Name{"created", CreatedTag, "CreatedTag"},
    Name{"mode", ModeTag, "ModeTag"},
    Name{"creator", CreatorTag, "CreatorTag"},
    Name{"modified", ModifiedTag, "ModifiedTag"},
    Name{"date", DateTag, "DateTag"},
    Name{"name", NameTag, "NameTag"},
    Name{"dc", DCTag, "DCTag"},
    Name{"nick", NickTag, "NickTag"},
    Name{"description", DescriptionTag, "DescriptionTag"},
    Name{"no", NoTag, "NoTag"},
    Name{"email", EmailTag, "EmailTag"},
    Name{"person", PersonTag, "PersonTag"},
    Name{"enclosure", EnclosureTag, "EnclosureTag"},
    Name{"pubdate", PubDateTag, "PubDateTag"},
    Name{"encoded", EncodedTag, "EncodedTag"},
    Name{"published", PublishedTag, "PublishedTag"},
    Name{"entry", EntryTag, "EntryTag"},
    Name{"rdf", RDFTag, "RDFTag"},
    Name{"escaped", EscapedTag, "EscapedTag"},
    Name{"rel", RelTag, "RelTag"},
    Name{"false", FalseTag, "FalseTag"},
    Name{"resource", ResourceTag, "ResourceTag"},
    Name{"family_name", FamilyNameTag, "FamilyNameTag"},
    Name{"familyname", FamilyNameTag, "FamilyNameTag"},
    Name{"rights", RightsTag, "RightsTag"},
    Name{"feed", FeedTag, "FeedTag"},
    Name{"rss", RSSTag, "RSSTag"},
    Name{"first_name", FirstNameTag, "FirstNameTag"},
    Name{"firstname", FirstNameTag, "FirstNameTag"},
    Name{"size", SizeTag, "SizeTag"},
    Name{"foaf", FOAFTag, "FOAFTag"},
    Name{"subtitle", SubtitleTag, "SubtitleTag"},
    Name{"given_name", GivenNameTag, "GivenNameTag"},
    Name{"givenname", GivenNameTag, "GivenNameTag"},
    Name{"summary", SummaryTag, "SummaryTag"},
    Name{"guid", GUIDTag, "GUIDTag"},
    Name{"sur_name", SurNameTag, "SurNameTag"},
    Name{"surname", SurNameTag, "SurNameTag"},
    Name{"head", HeadTag, "HeadTag"},
    Name{"text", TextTag, "TextTag"},
    Name{"homepage", HomepageTag, "HomepageTag"},
    Name{"text/html", TextHTMLTag, "TextHTMLTag"},
    Name{"href", HrefTag, "HrefTag"},
    Name{"text/plain", TextPlainTag, "TextPlainTag"},
    Name{"html", HTMLTag, "HTMLTag"},
    Name{"text/xhtml", TextXHTMLTag, "TextXHTMLTag"},
    Name{"icon", IconTag, "IconTag"},
    Name{"text/xhtml+xml", TextXHTMLXMLTag, "TextXHTMLXMLTag"},
    Name{"id", IDTag, "IDTag"},
    Name{"title", TitleTag, "TitleTag"},
    Name{"image", ImageTag, "ImageTag"},
    Name{"type", TypeTag, "TypeTag"},
    Name{"ispermalink", IsPermaLinkTag, "IsPermaLinkTag"},
    Name{"updated", UpdatedTag, "UpdatedTag"},
    Name{"uri", URITag, "URITag"},
    Name{"url", URLTag, "URLTag"},
    Name{"version", VersionTag, "VersionTag"},
    Name{"weblog", WeblogTag, "WeblogTag"},
    Name{"xhtml", XHTMLTag, "XHTMLTag"},
    Name{"xml", XMLTag, "XMLTag"}};

class TagNames : public testing::TestWithParam<Name> {};

}  // namespace

TEST_P(TagNames, AreReadInAnyCaseAndAmongBlanks) {
    const std::string text = GetParam().text;
    EXPECT_EQ(sStringToTag(text.c_str()), GetParam().tag);
    std::string upper = text;
    std::transform(upper.begin(), upper.end(), upper.begin(),
                   [](unsigned char c) { return static_cast<char>(std::toupper(c)); });
    EXPECT_EQ(sStringToTag(upper.c_str()), GetParam().tag);
    EXPECT_EQ(sStringToTag((" \t\r\n" + text + "\n\r\t ").c_str()), GetParam().tag);
    EXPECT_STREQ(tagName(GetParam().tag), GetParam().tagName);
}

TEST_P(TagNames, AreReadWhole) {
    const std::string text = GetParam().text;
    EXPECT_NE(sStringToTag(text.substr(0, text.size() - 1).c_str()), GetParam().tag);
    EXPECT_EQ(sStringToTag((text + "x").c_str()), UnknownTag);
    EXPECT_EQ(sStringToTag((text + " x").c_str()), UnknownTag);
    EXPECT_EQ(sStringToTag(("-" + text).c_str()), UnknownTag);
}

INSTANTIATE_TEST_SUITE_P(Tag, TagNames, testing::ValuesIn(kNames));

TEST(Tag, FoldsCaseInsideNames) {
    for (const char* text : {"isPermaLink", "ISPERMALINK", "isPermalink"}) {
        EXPECT_EQ(sStringToTag(text), IsPermaLinkTag) << text;
    }
}

TEST(Tag, IsBlankWithoutAName) {
    for (const char* text : {static_cast<const char*>(nullptr), "", " ", "\t\r\n "}) {
        EXPECT_EQ(sStringToTag(text), BlankTag);
    }
}

TEST(Tag, IsUnknownForAnythingElse) {
    for (const char* text :
         {"ti tle", "text/html; charset=utf-8", "\vtitle", "title\f", "titl\xE9", "\xC3\xA9", "x",
          "family-name", "root", "blank", "unknown", "text/", "base6", "."}) {
        EXPECT_EQ(sStringToTag(text), UnknownTag) << text;
    }
}

TEST(Tag, HasANameOfItsOwn) {
    std::set<std::string> names;
    for (int tag = BlankTag; tag <= XMLTag; ++tag) {
        names.insert(tagName(static_cast<Tag>(tag)));
    }
    EXPECT_EQ(names.size(), static_cast<std::size_t>(XMLTag) + 1);
    EXPECT_STREQ(tagName(BlankTag), "BlankTag");
    EXPECT_STREQ(tagName(UnknownTag), "UnknownTag");
    EXPECT_STREQ(tagName(RootTag), "RootTag");
}
