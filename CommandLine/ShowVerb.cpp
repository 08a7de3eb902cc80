#include "ShowVerb.h"

#include "CommonOptions.h"
#include "DateText.h"
#include "EntryListing.h"
#include "Failure.h"
#include "HTMLText.h"
#include "ListingWriter.h"
#include "Messages.h"
#include "Names.h"
#include "Output.h"
#include "Pager.h"
#include "Session.h"
#include "Terminal.h"
#include "TextLayout.h"

#include <algorithm>

namespace Commands {

namespace {

constexpr std::size_t kWidest = 90;  ///< columns that are still good to read

/// What the entry says: its content, or else its summary; null if it says nothing.
std::shared_ptr<OVContent> bodyOf(const OVEntry& entry) {
    const std::shared_ptr<OVContent> content = entry.content();
    const bool isThere = content && content->data() && !content->data()->empty();
    return isThere ? content : entry.summary();
}

std::string htmlOf(const OVEntry& entry) {
    const std::shared_ptr<OVContent> body = bodyOf(entry);
    return body ? body->HTMLString().value_or("") : std::string();
}

std::string baseOf(const OVEntry& entry) {
    return entry.baseURL().value_or(entry.alternateURL().value_or(""));
}

HTMLText textOf(const OVEntry& entry) {
    const std::size_t columns =
        Terminal::isOutput() ? std::min(Terminal::width(), kWidest) : kWidest;
    return HTMLText(htmlOf(entry), columns, baseOf(entry));
}

void addLine(std::string& text, const char* label, const std::string& value) {
    if (!value.empty()) text += TextLayout::pad(label, 10) + TextLayout::clean(value) + '\n';
}

std::string headOf(const OVEntry& entry) {
    const std::shared_ptr<OVFeed> feed = entry.feed();
    const std::string title = TextLayout::clean(entry.titleForDisplay());
    std::string text = (Terminal::hasColours() ? "\033[1m" + title + "\033[0m" : title) + '\n';
    addLine(text, "Feed", feed ? Names::titleOf(*feed) : "");
    addLine(text, "By", entry.authorsForDisplay());
    const auto date = entry.dateForDisplay();
    if (date) {
        addLine(text, "Date",
                Terminal::isOutput() ? DateText::relative(*date, DateText::now())
                                     : DateText::iso8601(*date));
    }
    addLine(text, "Page", entry.alternateURL().value_or(""));
    for (const std::shared_ptr<OVEnclosure>& each : entry.enclosures()) {
        addLine(text, "Enclosure", each->URL().value_or(""));
    }
    addLine(text, "ID", entry.identifier().value_or(""));
    return text;
}

std::string linkList(const std::vector<std::string>& links) {
    std::string text;
    for (std::size_t i = 0; i < links.size(); ++i) {
        text += '[' + std::to_string(i + 1) + "] " + links[i] + '\n';
    }
    return text;
}

std::string completeText(const OVEntry& entry) {
    const HTMLText body = textOf(entry);
    std::string text = headOf(entry) + '\n' + body.text();
    if (!body.links().empty()) text += '\n' + linkList(body.links());
    return text;
}

Listing listOf(const std::shared_ptr<OVEntry>& entry) {
    Listing listing = EntryListing::of({entry}, EntryListing::Extent::Complete);
    const HTMLText body = textOf(*entry);
    const std::vector<std::pair<const char*, Value>> more = {
        {"html", htmlOf(*entry)}, {"text", body.text()}, {"links", body.links()}};
    for (const auto& [key, value] : more) {
        listing.columns.push_back({key});
        listing.rows[0].values.push_back(value);
    }
    return listing;
}

std::string xmlOf(const OVEntry& entry) {
    const std::optional<OVXMLElement> xml = entry.XMLRepresentation();
    if (!xml) throw Failure(ExitStatus::NothingMatched, "the entry has no XML any more");
    return xml->XMLString() + '\n';
}

}  // namespace

const VerbSpec& ShowVerb::getSpec() const {
    static const VerbSpec sSpec{
        .name = "show",
        .summary = "show what an entry says",
        .operands = "ENTRY",
        .fewest = 1,
        .most = 1,
        .kind = WordKind::Entry,
        .options = CommonOptions::join({{{"html", 0, "", "Its HTML, which is safe to show"},
                                         {"xml", 0, "", "The entry as an element of Atom"},
                                         {"links", 'l', "", "Only its links, with their numbers"}},
                                        CommonOptions::output(),
                                        CommonOptions::client()}),
        .details =
            "The text of the entry, with a number behind each link, and the list of the links "
            "below it. On a terminal it is shown with the program that PAGER names.\n\n"
            "That an entry was shown does not make it read: see \"orvane mark\".",
        .examples = {"show 3f9a21c", "show --links \"Tidal power\"",
                     "show --html 3f9a21c > entry.html"},
    };
    return sSpec;
}

ExitStatus ShowVerb::run(const Arguments& arguments) {
    const Session session(arguments);
    const std::shared_ptr<OVEntry> entry = Names::entry(session.client(), arguments.operands()[0]);
    if (arguments.has("json") || arguments.has("jsonl")) {
        ListingWriter::writeObject(listOf(entry), arguments);
    } else if (arguments.has("html")) {
        Output::write(htmlOf(*entry) + '\n');
    } else if (arguments.has("xml")) {
        Output::write(xmlOf(*entry));
    } else if (arguments.has("links")) {
        const std::vector<std::string> links = textOf(*entry).links();
        if (links.empty()) Messages::say("No links.");
        Output::write(linkList(links));
        return links.empty() ? ExitStatus::NothingMatched : ExitStatus::Done;
    } else {
        Pager::show(completeText(*entry));
    }
    return ExitStatus::Done;
}

}  // namespace Commands
