#include "DocumentText.h"

#include "TimeText.h"

#include <cstddef>
#include <string_view>

namespace Commands {

namespace {

constexpr std::size_t kLabelWidth = 12;

/// U+0080 to U+009F in UTF-8, which terminals may take for commands as well.
bool isC1Control(std::string_view text, std::size_t at) {
    return text[at] == '\xC2' && at + 1 < text.size() &&
           static_cast<unsigned char>(text[at + 1]) < 0xA0;
}

/// The text on one line, harmless to a terminal.
std::string shown(std::string_view text) {
    std::string result;
    for (std::size_t i = 0; i < text.size(); ++i) {
        const char c = text[i];
        if (c == '\n' || c == '\r' || c == '\t') {
            result += ' ';
        } else if (isC1Control(text, i)) {
            ++i;
        } else if (static_cast<unsigned char>(c) >= ' ' && c != '\x7F') {
            result += c;
        }
    }
    return result;
}

/// Lines of labels with what they stand for.
class Lines {
 public:
    void add(std::size_t indent, std::string_view label, std::string_view value) {
        std::string line(indent, ' ');
        line += label;
        line.resize(std::max(line.size(), indent + kLabelWidth), ' ');
        mText += line + shown(value) + '\n';
    }
    void add(std::size_t indent, std::string_view label, const OVDocument::Text& value) {
        if (value && !value->empty()) add(indent, label, std::string_view(*value));
    }
    void add(std::size_t indent, std::string_view label, const OVDocument::Time& time) {
        if (time) add(indent, label, std::string_view(TimeText::iso8601(*time)));
    }
    void addPlain(std::string_view line) { mText += shown(line) + '\n'; }

    const std::string& text() const { return mText; }

 private:
    std::string mText;
};

std::string orEmpty(const OVDocument::Text& text) {
    return text.value_or(std::string());
}

std::string nameOf(const OVDocument::Author& author) {
    std::string name = orEmpty(author.name);
    if (author.email) name += (name.empty() ? "<" : " <") + *author.email + ">";
    if (author.url) name += (name.empty() ? "" : " ") + *author.url;
    return name;
}

std::string sizeOf(const OVDocument::Content& content) {
    return orEmpty(content.type) + ", " + std::to_string(content.data.size()) + " bytes";
}

const char* meaningOf(OVDocument::LinkKind kind) {
    switch (kind) {
        case OVDocument::LinkKind::RSSFeed:
            return "RSS feed";
        case OVDocument::LinkKind::AtomFeed:
            return "Atom feed";
        case OVDocument::LinkKind::AtomService:
            return "Atom service";
        case OVDocument::LinkKind::FOAFDocument:
            return "FOAF document";
        case OVDocument::LinkKind::RSDDocument:
            return "RSD document";
        case OVDocument::LinkKind::Self:
            return "the feed itself";
        case OVDocument::LinkKind::AlternatePage:
            return "page";
        case OVDocument::LinkKind::Nothing:
            break;
    }
    return "other";
}

const char* meaningOf(OVDocument::Kind kind) {
    switch (kind) {
        case OVDocument::Kind::Page:
            return "a web page";
        case OVDocument::Kind::Feed:
            return "a feed";
        case OVDocument::Kind::Entry:
            return "a single entry";
        case OVDocument::Kind::Friend:
            return "a person";
        case OVDocument::Kind::Unknown:
            break;
    }
    return "nothing that can be read";
}

const char* meaningOf(OVDocument::Format format) {
    switch (format) {
        case OVDocument::Format::RSS:
            return " (RSS)";
        case OVDocument::Format::Atom:
            return " (Atom)";
        case OVDocument::Format::Unknown:
            break;
    }
    return "";
}

std::string headOf(const std::string& file, const OVDocument& document) {
    std::string line = file + ": " + meaningOf(document.kind) + meaningOf(document.format) +
                       ", attempt " + std::to_string(document.attempts);
    if (document.tidiedWith) line += ", repaired by " + *document.tidiedWith;
    return line;
}

void addLinks(const std::vector<OVDocument::Link>& links, Lines& lines) {
    for (const OVDocument::Link& link : links) {
        std::string line = link.url ? *link.url : orEmpty(link.href);
        line += std::string(" (") + meaningOf(link.kind);
        if (link.title) line += ", \"" + *link.title + '"';
        lines.add(2, "Link", std::string_view(line + ')'));
    }
}

void addFeed(const OVDocument::Feed& feed, Lines& lines) {
    lines.add(2, "Title", feed.title);
    lines.add(2, "Subtitle", feed.subtitle);
    lines.add(2, "URL", feed.url);
    lines.add(2, "Page", feed.alternateURL);
    lines.add(2, "ID", feed.id);
    lines.add(2, "Icon", feed.iconURL);
    lines.add(2, "Logo", feed.logoURL);
    lines.add(2, "Rights", feed.rights);
    lines.add(2, "Updated", feed.dateUpdated);
}

void addInfo(const OVDocument& document, Lines& lines) {
    lines.add(2, "Published", document.defaultTimePublished);
    for (const OVDocument::Author& author : document.defaultAuthors) {
        lines.add(2, "Author", std::string_view(nameOf(author)));
    }
    for (const OVDocument::Author& author : document.defaultContributors) {
        lines.add(2, "Contributor", std::string_view(nameOf(author)));
    }
    addLinks(document.links, lines);
}

void addContent(std::string_view label, const std::optional<OVDocument::Content>& content,
                Lines& lines) {
    if (content) lines.add(5, label, std::string_view(sizeOf(*content)));
}

void addEntry(std::size_t number, const OVDocument::Entry& entry, Lines& lines) {
    lines.addPlain("  " + std::to_string(number) + ". " + orEmpty(entry.title));
    lines.add(5, "Page", entry.alternateURL);
    lines.add(5, "ID", entry.id);
    if (entry.author) lines.add(5, "Author", std::string_view(nameOf(*entry.author)));
    lines.add(5, "Rights", entry.rights);
    lines.add(5, "Created", entry.dateCreated);
    lines.add(5, "Published", entry.datePublished);
    lines.add(5, "Updated", entry.dateUpdated);
    addContent("Summary", entry.summary, lines);
    addContent("Content", entry.content, lines);
    for (const OVDocument::Enclosure& enclosure : entry.enclosures) {
        lines.add(5, "Enclosure",
                  std::string_view(orEmpty(enclosure.url) + " (" + orEmpty(enclosure.mimeType) +
                                   ", " + std::to_string(enclosure.length) + " bytes)"));
    }
}

void addPerson(std::size_t indent, const OVDocument::Friend& person, Lines& lines) {
    lines.add(indent, "Name", person.name);
    lines.add(indent, "First name", person.firstName);
    lines.add(indent, "Family name", person.familyName);
    lines.add(indent, "Nick", person.nick);
    lines.add(indent, "URL", person.url);
    for (const OVDocument::Friend& known : person.knows) {
        lines.add(indent, "Knows", std::string_view());
        addPerson(indent + 2, known, lines);
    }
}

}  // namespace

std::string DocumentText::text(const std::string& file, const OVDocument& document) {
    Lines lines;
    lines.addPlain(headOf(file, document));
    if (document.feed) addFeed(*document.feed, lines);
    addInfo(document, lines);
    if (document.page) {
        lines.add(2, "Base", document.page->base);
        addLinks(document.page->links, lines);
    }
    if (document.person) addPerson(2, *document.person, lines);
    for (std::size_t i = 0; i < document.entries.size(); ++i) {
        addEntry(i + 1, document.entries[i], lines);
    }
    return lines.text();
}

}  // namespace Commands
