#include <Orvane/OVDocument.h>

#include "FeedParser/Parser.h"
#include "Foundation/AutoreleasePool.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "SQLite/Database.h"

#include <Orvane/OVException.h>

#include <cmath>

using namespace Foundation;
using namespace Orvane;
using FeedParser::Info;
using FeedParser::Parser;

namespace {

using Text = OVDocument::Text;
using Time = OVDocument::Time;

/// The start of dates, 2001-01-01 00:00:00 GMT.
constexpr std::chrono::sys_seconds kEpoch{std::chrono::seconds{978307200}};

Text text(const String* string) {
    return string ? Text(string->utf8()) : std::nullopt;
}

Text text(const URL* url) {
    if (!url) return std::nullopt;
    const Ref<String> string = url->getString();
    return text(string.get());
}

Time time(const Date* date) {
    if (!date) return std::nullopt;
    const double seconds = std::floor(date->getAbsoluteTime());
    return kEpoch + std::chrono::seconds(static_cast<long long>(seconds));
}

/// Whether the type is one that contents have which came as text: all other data came in base64.
bool isOfText(const ContentCore& content) {
    const std::string_view type = String::view(content.mMIMEType.getValue());
    return type.empty() || type == "text/plain" || type == "text/html" ||
           type == "application/xhtml+xml";
}

std::optional<OVDocument::Content> describe(const ContentCore* content, OVDocument::Contents how) {
    if (!content) return std::nullopt;
    const Data* data =
        how == OVDocument::Contents::Tidied ? content->getData() : content->mData.getValue();
    if (!data) return std::nullopt;
    return OVDocument::Content{.data = std::string(data->view()),
                               .type = text(content->mMIMEType.getValue()),
                               .isBinary = !isOfText(*content)};
}

OVDocument::Author describe(const AuthorCore& author) {
    return {.name = text(author.mName.getValue()),
            .email = text(author.mEmail.getValue()),
            .url = text(author.mURL.getValue())};
}

std::vector<OVDocument::Author> describe(const ArrayOf<AuthorCore>* authors) {
    std::vector<OVDocument::Author> all;
    if (!authors) return all;
    for (const AuthorCore* author : *authors) {
        all.push_back(describe(*author));
    }
    return all;
}

std::vector<OVDocument::Link> describe(const ArrayOf<HTMLLink>* links) {
    std::vector<OVDocument::Link> all;
    if (!links) return all;
    for (const HTMLLink* link : *links) {
        const AutoreleasePool pool;
        const Ref<URL> url = link->getURL();
        all.push_back({.rel = text(link->mRel.get()),
                       .type = text(link->mType.get()),
                       .title = text(link->mTitle.get()),
                       .href = text(link->mHref.get()),
                       .url = text(url.get()),
                       .kind = static_cast<OVDocument::LinkKind>(link->getHTMLLinkType())});
    }
    return all;
}

std::vector<OVDocument::Enclosure> enclosuresOf(const EntryCore& entry) {
    std::vector<OVDocument::Enclosure> all;
    for (auto each = entry.getEnclosures(nullptr); each.hasRow(); each.nextRow()) {
        all.push_back({.url = text(each->mURL.getValue()),
                       .mimeType = text(each->mMIMEType.getValue()),
                       .title = text(each->mTitle.getValue()),
                       .length = each->mLength.getValue()});
    }
    return all;
}

OVDocument::Entry describe(EntryCore& entry, OVDocument::Contents how) {
    const AutoreleasePool pool;
    const AuthorCore* author = entry.getAuthor();
    return {.id = text(entry.mID.getValue()),
            .title = text(entry.mTitle.getValue()),
            .rights = text(entry.mRights.getValue()),
            .alternateURL = text(entry.mAlternateURL.getValue()),
            .baseURL = text(entry.mBaseURL.getValue()),
            .author = author ? std::optional(describe(*author)) : std::nullopt,
            .content = describe(entry.getContent(), how),
            .summary = describe(entry.getSummary(), how),
            .dateCreated = time(entry.mDateCreated.getValue()),
            .datePublished = time(entry.mDatePublished.getValue()),
            .dateUpdated = time(entry.mDateUpdated.getValue()),
            .enclosures = enclosuresOf(entry),
            .xmlHash = text(entry.getXMLRepresentationHash())};
}

OVDocument::Feed describe(const FeedCore& feed) {
    return {.title = text(feed.mTitle.getValue()),
            .subtitle = text(feed.mSubtitle.getValue()),
            .id = text(feed.mID.getValue()),
            .rights = text(feed.mRights.getValue()),
            .alternateURL = text(feed.mAlternateURL.getValue()),
            .iconURL = text(feed.mIconURL.getValue()),
            .logoURL = text(feed.mLogoURL.getValue()),
            .url = text(feed.mURL.getValue()),
            .dateUpdated = time(feed.mDateUpdated.getValue())};
}

OVDocument::Friend describe(const Friend& person) {
    OVDocument::Friend result{.name = text(person.mName.get()),
                              .firstName = text(person.mFirstName.get()),
                              .familyName = text(person.mFamilyName.get()),
                              .nick = text(person.mNick.get()),
                              .url = text(person.mURL.get()),
                              .knows = {}};
    for (const Friend* known : *person.mKnows.get()) {
        result.knows.push_back(describe(*known));
    }
    return result;
}

std::vector<OVDocument::Entry> entriesOf(const Info& info, OVDocument::Contents how) {
    std::vector<OVDocument::Entry> all;
    if (EntryCore* single = info.getEntry()) all.push_back(describe(*single, how));
    if (const FeedCore* feed = info.getFeed()) {
        for (auto each = feed->getEntries(nullptr); each.hasRow(); each.nextRow()) {
            all.push_back(describe(*each.getRow(), how));
        }
    }
    return all;
}

OVDocument::Kind describe(Info::Kind kind) {
    switch (kind) {
        case Info::PageKind:
            return OVDocument::Kind::Page;
        case Info::FeedKind:
            return OVDocument::Kind::Feed;
        case Info::EntryKind:
            return OVDocument::Kind::Entry;
        case Info::FriendKind:
            return OVDocument::Kind::Friend;
        default:
            return OVDocument::Kind::Unknown;
    }
}

OVDocument describe(const Parser& parser, OVDocument::Contents how) {
    const Info& info = *parser.getInfo();
    OVDocument document;
    document.kind = describe(info.kind);
    document.format = static_cast<OVDocument::Format>(info.format);
    document.attempts = parser.getAttemptCount();
    if (parser.getTidierName()) document.tidiedWith = parser.getTidierName();
    if (const FeedCore* feed = info.getFeed()) document.feed = describe(*feed);
    if (const HTMLPage* page = info.getPage()) {
        document.page = {.base = text(page->getBaseURL()), .links = describe(page->getLinks())};
    }
    if (const Friend* person = info.getFriend()) document.person = describe(*person);
    document.entries = entriesOf(info, how);
    document.links = describe(info.links.get());
    document.defaultAuthors = describe(info.defaultAuthors.get());
    document.defaultContributors = describe(info.defaultContributors.get());
    document.defaultTimePublished = time(info.defaultTimePublished.get());
    return document;
}

Ref<URL> locationOf(const std::string& text) {
    if (text.empty()) return nullptr;
    const Ref<String> string = String::string(text);
    Ref<URL> location = URL::url(string.get());
    if (!location.get()) location = URL::lenientURL(string.get(), nullptr);
    if (!location.get() || !location->hasScheme()) {
        throw OVException("Not an absolute URL: " + text);
    }
    return location;
}

}  // namespace

OVDocument OVDocument::read(std::string_view bytes, const std::string& url, Contents contents) {
    try {
        const AutoreleasePool pool;
        SQLite::Database::initialize();
        const Ref<URL> location = locationOf(url);
        const Ref<Data> data = Data::data(bytes.data(), bytes.size());
        const Parser parser(data.get(), location.get());
        return describe(parser, contents);
    } catch (const OVException&) {
        throw;
    } catch (const std::exception& failure) {
        throw OVException(std::string("The document could not be read: ") + failure.what());
    }
}
