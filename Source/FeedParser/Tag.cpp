#include "FeedParser/Tag.h"

#include "FeedParser/NameTrie.h"

namespace Orvane::FeedParser {

namespace {

struct TagSpec {
    const char* text;
    Tag tag;
};

constexpr TagSpec kTagSpecs[] = {
    {"application/xhtml+xml", ApplicationXHTMLXMLTag},
    {"author", AuthorTag},
    {"base64", Base64Tag},
    {"base", BaseTag},
    {"channel", ChannelTag},
    {"content", ContentTag},
    {"contributor", ContributorTag},
    {"created", CreatedTag},
    {"creator", CreatorTag},
    {"date", DateTag},
    {"dc", DCTag},
    {"description", DescriptionTag},
    {"email", EmailTag},
    {"enclosure", EnclosureTag},
    {"encoded", EncodedTag},
    {"entry", EntryTag},
    {"escaped", EscapedTag},
    {"false", FalseTag},
    {"family_name", FamilyNameTag},
    {"familyname", FamilyNameTag},
    {"feed", FeedTag},
    {"first_name", FirstNameTag},
    {"firstname", FirstNameTag},
    {"foaf", FOAFTag},
    {"given_name", GivenNameTag},
    {"givenname", GivenNameTag},
    {"guid", GUIDTag},
    {"head", HeadTag},
    {"homepage", HomepageTag},
    {"href", HrefTag},
    {"html", HTMLTag},
    {"icon", IconTag},
    {"id", IDTag},
    {"image", ImageTag},
    {"ispermalink", IsPermaLinkTag},
    {"issued", IssuedTag},
    {"item", ItemTag},
    {"knows", KnowsTag},
    {"lastbuilddate", LastBuildDateTag},
    {"length", LengthTag},
    {"link", LinkTag},
    {"logo", LogoTag},
    {"mode", ModeTag},
    {"modified", ModifiedTag},
    {"name", NameTag},
    {"nick", NickTag},
    {"no", NoTag},
    {"person", PersonTag},
    {"pubdate", PubDateTag},
    {"published", PublishedTag},
    {"rdf", RDFTag},
    {"rel", RelTag},
    {"resource", ResourceTag},
    {"rights", RightsTag},
    {"rss", RSSTag},
    {"size", SizeTag},
    {"subtitle", SubtitleTag},
    {"summary", SummaryTag},
    {"sur_name", SurNameTag},
    {"surname", SurNameTag},
    {"text/html", TextHTMLTag},
    {"text/plain", TextPlainTag},
    {"text", TextTag},
    {"text/xhtml", TextXHTMLTag},
    {"text/xhtml+xml", TextXHTMLXMLTag},
    {"title", TitleTag},
    {"type", TypeTag},
    {"updated", UpdatedTag},
    {"uri", URITag},
    {"url", URLTag},
    {"version", VersionTag},
    {"weblog", WeblogTag},
    {"xhtml", XHTMLTag},
    {"xml", XMLTag},
};

constexpr std::size_t kTagNodes = 512;
constexpr NameTrie<kTagNodes> kTags(kTagSpecs);

constexpr const char* kTagNames[] = {
    "BlankTag",
    "UnknownTag",
    "RootTag",
    "ApplicationXHTMLXMLTag",
    "AuthorTag",
    "Base64Tag",
    "BaseTag",
    "ChannelTag",
    "ContentTag",
    "ContributorTag",
    "CreatedTag",
    "CreatorTag",
    "DateTag",
    "DCTag",
    "DescriptionTag",
    "EmailTag",
    "EnclosureTag",
    "EncodedTag",
    "EntryTag",
    "EscapedTag",
    "FalseTag",
    "FamilyNameTag",
    "FeedTag",
    "FirstNameTag",
    "FOAFTag",
    "GivenNameTag",
    "GUIDTag",
    "HeadTag",
    "HomepageTag",
    "HrefTag",
    "HTMLTag",
    "IconTag",
    "IDTag",
    "ImageTag",
    "IsPermaLinkTag",
    "IssuedTag",
    "ItemTag",
    "KnowsTag",
    "LastBuildDateTag",
    "LengthTag",
    "LinkTag",
    "LogoTag",
    "ModeTag",
    "ModifiedTag",
    "NameTag",
    "NickTag",
    "NoTag",
    "PersonTag",
    "PubDateTag",
    "PublishedTag",
    "RDFTag",
    "RelTag",
    "ResourceTag",
    "RightsTag",
    "RSSTag",
    "SizeTag",
    "SubtitleTag",
    "SummaryTag",
    "SurNameTag",
    "TextHTMLTag",
    "TextPlainTag",
    "TextTag",
    "TextXHTMLTag",
    "TextXHTMLXMLTag",
    "TitleTag",
    "TypeTag",
    "UpdatedTag",
    "URITag",
    "URLTag",
    "VersionTag",
    "WeblogTag",
    "XHTMLTag",
    "XMLTag",
};

}  // namespace

Tag sStringToTag(const char* text) {
    if (!text) return BlankTag;
    text = skipNameBlanks(text);
    if (*text == '\0') return BlankTag;
    auto node = kTags.kRoot;
    for (; *text && !isNameBlank(*text); ++text) {
        node = kTags.step(node, *text);
        if (node == kTags.kRoot) return UnknownTag;
    }
    const int place = kTags.value(node);
    return place == kTags.kNone || *skipNameBlanks(text) ? UnknownTag : kTagSpecs[place].tag;
}

const char* tagName(Tag tag) {
    return kTagNames[tag];
}

}  // namespace Orvane::FeedParser
