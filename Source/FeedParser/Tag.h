#pragma once

#include <cstdint>

namespace Orvane::FeedParser {

/// What the names in a feed mean, whichever dialect they come from: one value for each concept.
/// The same table serves elements, prefixes, attributes and values of attributes.
enum Tag : std::uint8_t {
    BlankTag,    ///< no name, or nothing but blanks
    UnknownTag,  ///< a name that is not in the table
    RootTag,     ///< of no name: the root of a parse alone has it
    ApplicationXHTMLXMLTag,
    AuthorTag,
    Base64Tag,
    BaseTag,
    ChannelTag,
    ContentTag,
    ContributorTag,
    CreatedTag,
    CreatorTag,
    DateTag,
    DCTag,
    DescriptionTag,
    EmailTag,
    EnclosureTag,
    EncodedTag,
    EntryTag,
    EscapedTag,
    FalseTag,
    FamilyNameTag,
    FeedTag,
    FirstNameTag,
    FOAFTag,
    GivenNameTag,
    GUIDTag,
    HeadTag,
    HomepageTag,
    HrefTag,
    HTMLTag,
    IconTag,
    IDTag,
    ImageTag,
    IsPermaLinkTag,
    IssuedTag,
    ItemTag,
    KnowsTag,
    LastBuildDateTag,
    LengthTag,
    LinkTag,
    LogoTag,
    ModeTag,
    ModifiedTag,
    NameTag,
    NickTag,
    NoTag,
    PersonTag,
    PubDateTag,
    PublishedTag,
    RDFTag,
    RelTag,
    ResourceTag,
    RightsTag,
    RSSTag,
    SizeTag,
    SubtitleTag,
    SummaryTag,
    SurNameTag,
    TextHTMLTag,
    TextPlainTag,
    TextTag,
    TextXHTMLTag,
    TextXHTMLXMLTag,
    TitleTag,
    TypeTag,
    UpdatedTag,
    URITag,
    URLTag,
    VersionTag,
    WeblogTag,
    XHTMLTag,
    XMLTag,
};

/// The tag of a name, by the whole name in any case. Blanks (space, tab, CR, LF) at both ends do
/// not count. Null is `BlankTag`. Takes one step for each character, and nothing from the heap.
Tag sStringToTag(const char* text);

/// The tag's own name, for logs: "AuthorTag". Lives for ever.
const char* tagName(Tag tag);

}  // namespace Orvane::FeedParser
