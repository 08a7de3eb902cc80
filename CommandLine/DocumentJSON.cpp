#include "DocumentJSON.h"

#include "JSONText.h"
#include "TimeText.h"

#include <nlohmann/json.hpp>

#include <string_view>
#include <utility>

namespace Commands {

namespace {

using JSON = nlohmann::ordered_json;

// Here, so that lists and optional parts find them.
JSON json(const OVDocument::Author& author);
JSON json(const OVDocument::Enclosure& enclosure);
JSON json(const OVDocument::Link& link);
JSON json(const OVDocument::Entry& entry);
JSON json(const OVDocument::Feed& feed);
JSON json(const OVDocument::Page& page);
JSON json(const OVDocument::Friend& person);

template <class T>
JSON json(const std::vector<T>& all) {
    JSON list = JSON::array();
    for (const T& each : all) {
        list.push_back(json(each));
    }
    return list;
}

template <class T>
JSON json(const std::optional<T>& part) {
    return part ? json(*part) : JSON(nullptr);
}

JSON json(const OVDocument::Text& text) {
    return text ? JSON(*text) : JSON(nullptr);
}

JSON json(const OVDocument::Time& time) {
    return time ? JSON(TimeText::iso8601(*time)) : JSON(nullptr);
}

/// RFC 4648, section 4.
std::string base64(std::string_view bytes) {
    constexpr char kDigits[] = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
    std::string text;
    text.reserve((bytes.size() + 2) / 3 * 4);
    for (std::size_t i = 0; i < bytes.size(); i += 3) {
        const auto byte = [&](std::size_t at) {
            return at < bytes.size() ? static_cast<unsigned char>(bytes[at]) : 0U;
        };
        const unsigned group = byte(i) << 16 | byte(i + 1) << 8 | byte(i + 2);
        for (std::size_t digit = 0; digit < 4; ++digit) {
            const bool isThere = i + digit <= bytes.size();
            text += isThere ? kDigits[group >> (18 - 6 * digit) & 63] : '=';
        }
    }
    return text;
}

JSON data(const std::optional<OVDocument::Content>& content) {
    if (!content) return nullptr;
    return content->isBinary ? base64(content->data) : content->data;
}

JSON type(const std::optional<OVDocument::Content>& content) {
    return content ? json(content->type) : JSON(nullptr);
}

JSON json(const OVDocument::Author& author) {
    return {{"name", json(author.name)}, {"email", json(author.email)}, {"url", json(author.url)}};
}

JSON json(const OVDocument::Enclosure& enclosure) {
    return {{"url", json(enclosure.url)},
            {"mimeType", json(enclosure.mimeType)},
            {"length", enclosure.length},
            {"title", json(enclosure.title)}};
}

JSON json(const OVDocument::Link& link) {
    return {{"rel", json(link.rel)},     {"type", json(link.type)},
            {"title", json(link.title)}, {"href", json(link.href)},
            {"url", json(link.url)},     {"kind", static_cast<int>(link.kind)}};
}

JSON json(const OVDocument::Entry& entry) {
    return {{"id", json(entry.id)},
            {"title", json(entry.title)},
            {"rights", json(entry.rights)},
            {"alternateUrl", json(entry.alternateURL)},
            {"baseUrl", json(entry.baseURL)},
            {"author", json(entry.author)},
            {"content", data(entry.content)},
            {"contentType", type(entry.content)},
            {"summary", data(entry.summary)},
            {"summaryType", type(entry.summary)},
            {"dateCreated", json(entry.dateCreated)},
            {"datePublished", json(entry.datePublished)},
            {"dateUpdated", json(entry.dateUpdated)},
            {"enclosures", json(entry.enclosures)},
            {"xmlHash", json(entry.xmlHash)}};
}

JSON json(const OVDocument::Feed& feed) {
    return {{"title", json(feed.title)},
            {"subtitle", json(feed.subtitle)},
            {"id", json(feed.id)},
            {"rights", json(feed.rights)},
            {"alternateUrl", json(feed.alternateURL)},
            {"iconUrl", json(feed.iconURL)},
            {"logoUrl", json(feed.logoURL)},
            {"dateUpdated", json(feed.dateUpdated)},
            {"url", json(feed.url)}};
}

JSON json(const OVDocument::Page& page) {
    return {{"base", json(page.base)}, {"links", json(page.links)}};
}

JSON json(const OVDocument::Friend& person) {
    return {{"name", json(person.name)},
            {"firstName", json(person.firstName)},
            {"familyName", json(person.familyName)},
            {"nick", json(person.nick)},
            {"url", json(person.url)},
            {"knows", json(person.knows)}};
}

const char* nameOf(OVDocument::Kind kind) {
    switch (kind) {
        case OVDocument::Kind::Page:
            return "page";
        case OVDocument::Kind::Feed:
            return "feed";
        case OVDocument::Kind::Entry:
            return "entry";
        case OVDocument::Kind::Friend:
            return "friend";
        case OVDocument::Kind::Unknown:
            break;
    }
    return "unknown";
}

JSON infoOf(const OVDocument& document) {
    return {{"links", json(document.links)},
            {"defaultAuthors", json(document.defaultAuthors)},
            {"defaultContributors", json(document.defaultContributors)},
            {"defaultTimePublished", json(document.defaultTimePublished)}};
}

}  // namespace

std::string DocumentJSON::line(const std::string& file, const OVDocument& document) {
    const JSON object = {{"file", file},
                         {"kind", nameOf(document.kind)},
                         {"format", static_cast<int>(document.format)},
                         {"attempts", document.attempts},
                         {"tidiedWith", json(document.tidiedWith)},
                         {"feed", json(document.feed)},
                         {"entries", json(document.entries)},
                         {"info", infoOf(document)},
                         {"page", json(document.page)},
                         {"friend", json(document.person)}};
    std::string line = object.dump(-1, ' ', false, JSON::error_handler_t::replace) + '\n';
    JSONText::escapeLineEnds(line);
    return line;
}

}  // namespace Commands
