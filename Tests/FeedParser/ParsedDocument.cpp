#include "FeedParser/ParsedDocument.h"

#include "FeedParser/Text/ParserUtils.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Foundation/String.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"

#include <nlohmann/json.hpp>

#include <sstream>

using namespace Foundation;
using namespace Orvane;
using FeedParser::Info;
using FeedParser::Parser;
using nlohmann::json;

namespace {

json text(const String* string) {
    return string ? json(string->utf8()) : json(nullptr);
}

json text(const URL* url) {
    if (!url) return nullptr;
    const Ref<String> string = url->getString();
    return text(string.get());
}

json time(const Date* date) {
    if (!date) return nullptr;
    std::string utc = Ref<String>(date->toString())->utf8();
    utc[utc.find(' ')] = 'T';
    return utc.substr(0, utc.find(' ')) + 'Z';
}

/// The data as it came, before it is tidied.
json data(const ContentCore* content) {
    const Data* bytes = content ? content->mData.getValue() : nullptr;
    return bytes ? json(std::string(bytes->view())) : json(nullptr);
}

json type(const ContentCore* content) {
    return content ? text(content->mMIMEType.getValue()) : json(nullptr);
}

json author(const AuthorCore* person) {
    if (!person) return nullptr;
    return {{"name", text(person->mName.getValue())},
            {"email", text(person->mEmail.getValue())},
            {"url", text(person->mURL.getValue())}};
}

json authors(const ArrayOf<AuthorCore>* people) {
    json list = json::array();
    for (std::size_t i = 0; people && i < people->count(); ++i) {
        list.push_back(author(people->at(i)));
    }
    return list;
}

json links(const ArrayOf<HTMLLink>* all) {
    json list = json::array();
    for (std::size_t i = 0; all && i < all->count(); ++i) {
        const HTMLLink* link = all->at(i);
        const Ref<URL> url = link->getURL();
        list.push_back({{"rel", text(link->mRel.get())},
                        {"type", text(link->mType.get())},
                        {"title", text(link->mTitle.get())},
                        {"href", text(link->mHref.get())},
                        {"url", text(url.get())},
                        {"kind", static_cast<int>(link->getHTMLLinkType())}});
    }
    return list;
}

json enclosures(const EntryCore& entry) {
    json list = json::array();
    for (auto each = entry.getEnclosures(nullptr); each.hasRow(); each.nextRow()) {
        list.push_back({{"url", text(each->mURL.getValue())},
                        {"mimeType", text(each->mMIMEType.getValue())},
                        {"length", each->mLength.getValue()},
                        {"title", text(each->mTitle.getValue())}});
    }
    return list;
}

json entry(const EntryCore& row) {
    return {{"id", text(row.mID.getValue())},
            {"title", text(row.mTitle.getValue())},
            {"rights", text(row.mRights.getValue())},
            {"alternateUrl", text(row.mAlternateURL.getValue())},
            {"baseUrl", text(row.mBaseURL.getValue())},
            {"author", author(row.getAuthor())},
            {"content", data(row.getContent())},
            {"contentType", type(row.getContent())},
            {"summary", data(row.getSummary())},
            {"summaryType", type(row.getSummary())},
            {"xml", data(row.getXMLRepresentation())},
            {"dateCreated", time(row.mDateCreated.getValue())},
            {"datePublished", time(row.mDatePublished.getValue())},
            {"dateUpdated", time(row.mDateUpdated.getValue())},
            {"enclosures", enclosures(row)}};
}

json feed(const FeedCore& row) {
    return {{"title", text(row.mTitle.getValue())},
            {"subtitle", text(row.mSubtitle.getValue())},
            {"id", text(row.mID.getValue())},
            {"rights", text(row.mRights.getValue())},
            {"alternateUrl", text(row.mAlternateURL.getValue())},
            {"iconUrl", text(row.mIconURL.getValue())},
            {"logoUrl", text(row.mLogoURL.getValue())},
            {"dateUpdated", time(row.mDateUpdated.getValue())},
            {"url", text(row.mURL.getValue())},
            {"format", row.mFeedFormat.getValue()}};
}

json entries(const Info& info) {
    json list = json::array();
    if (const EntryCore* single = info.getEntry()) list.push_back(entry(*single));
    if (const FeedCore* rows = info.getFeed()) {
        for (auto each = rows->getEntries(nullptr); each.hasRow(); each.nextRow()) {
            const AutoreleasePool pool;
            list.push_back(entry(*each.getRow()));
        }
    }
    return list;
}

json person(Friend& one) {
    json knows = json::array();
    for (Friend* known : *one.mKnows.get()) {
        knows.push_back(person(*known));
    }
    return {{"name", text(one.mName.get())},
            {"firstName", text(one.mFirstName.get())},
            {"familyName", text(one.mFamilyName.get())},
            {"nick", text(one.mNick.get())},
            {"url", text(one.mURL.get())},
            {"knows", knows}};
}

const char* kindName(Info::Kind kind) {
    switch (kind) {
        case Info::PageKind:
            return "page";
        case Info::FeedKind:
            return "feed";
        case Info::EntryKind:
            return "entry";
        case Info::FriendKind:
            return "friend";
        default:
            return "unknown";
    }
}

json orNull(const char* string) {
    return string ? json(string) : json(nullptr);
}

}  // namespace

json describe(const Parser& parser) {
    const AutoreleasePool pool;
    const Info& info = *parser.getInfo();
    json description = {{"kind", kindName(info.kind)},
                        {"format", static_cast<int>(info.format)},
                        {"attempts", parser.getAttemptCount()},
                        {"tidiedWith", orNull(parser.getTidierName())},
                        {"entries", entries(info)}};
    description["feed"] = info.getFeed() ? feed(*info.getFeed()) : json(nullptr);
    description["friend"] = info.getFriend() ? person(*info.getFriend()) : json(nullptr);
    description["info"] = {{"links", links(info.links.get())},
                           {"defaultAuthors", authors(info.defaultAuthors.get())},
                           {"defaultContributors", authors(info.defaultContributors.get())},
                           {"defaultTimePublished", time(info.defaultTimePublished.get())}};
    description["page"] = nullptr;
    if (const HTMLPage* page = info.getPage()) {
        description["page"] = {{"base", text(page->getBaseURL())},
                               {"links", links(page->getLinks())}};
    }
    return description;
}

json parsed(const std::string& document, const char* url) {
    const AutoreleasePool pool;
    const Ref<Data> bytes = Data::data(document.data(), document.size());
    const Ref<String> address = url ? String::string(url) : nullptr;
    const Ref<URL> location = URL::url(address.get());
    const Parser parser(bytes.get(), location.get());
    return describe(parser);
}

json valueAt(const json& description, const std::string& path) {
    json value = description;
    std::istringstream steps(path);
    std::string step;
    while (std::getline(steps, step, '.')) {
        const std::size_t bracket = step.find('[');
        const std::string name = step.substr(0, bracket);
        if (name == "count") return value.size();
        if (value.is_null() || !value.is_object() || !value.contains(name)) return nullptr;
        // A content's type stands beside it.
        const std::string rest(steps.str().substr(
            std::min<std::size_t>(steps.str().size(), static_cast<std::size_t>(steps.tellg()))));
        if (rest == "mimeType" && (name == "content" || name == "summary")) {
            return value[name + "Type"];
        }
        value = json(value[name]);
        if (bracket == std::string::npos) continue;
        const std::size_t index = std::stoul(step.substr(bracket + 1));
        if (!value.is_array() || index >= value.size()) return nullptr;
        value = json(value[index]);
    }
    return value;
}

std::string wordsOf(const std::string& markup) {
    std::string words = markup;
    const auto plain = [&] {
        words.resize(ParserUtils::convertToPlainText(words.data(), words.data()));
    };
    const auto decode = [&] {
        words.resize(ParserUtils::decodeEntities(words.data(), words.data(), true));
    };
    plain();
    decode();
    plain();
    decode();
    plain();
    decode();
    return words;
}
