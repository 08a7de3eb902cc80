#include "EntrySelection.h"

#include "DateText.h"
#include "Names.h"

#include <algorithm>
#include <sstream>

namespace Commands {

namespace {

void setOrder(const Arguments& arguments, OVEntryQuery& query) {
    const std::string order = arguments.value("sort").value_or("received");
    if (order == "title") {
        query.order = OVEntryQuery::Order::ByTitle;
        query.ascending = true;
    } else if (order == "feed") {
        query.order = OVEntryQuery::Order::ByFeed;
        query.ascending = true;
    } else if (order == "published") {
        query.date = OVEntryQuery::Date::ForDisplay;
    }
    if (arguments.has("reverse")) query.ascending = !query.ascending;
}

}  // namespace

std::vector<OptionSpec> EntrySelection::options() {
    return {
        {"unread", 'u', "", "Only unread ones"},
        {"read", 0, "", "Only those that have been read"},
        {"flagged", 'f', "", "Only flagged ones"},
        {"feed", 0, "FEED", "Only of this feed; may be given several times", WordKind::Feed},
        {"since", 0, "TIME", "Only from this time on: 2026-11-21, today, 12h, 3d"},
        {"until", 0, "TIME", "Only before this time"},
        {"search", 0, "WORDS", "Only those in which all of these words stand"},
        {"author", 0, "NAME", "Only by authors whose name or address has this in it"},
        {"has-enclosure", 0, "", "Only those with an enclosure"},
    };
}

bool EntrySelection::isGiven(const Arguments& arguments) {
    const std::vector<OptionSpec> all = options();
    return std::any_of(all.begin(), all.end(),
                       [&](const OptionSpec& option) { return arguments.has(option.name); });
}

OVEntryQuery EntrySelection::query(const Arguments& arguments, const OVClient& client) {
    OVEntryQuery query;
    const OVDate now = DateText::now();
    if (arguments.has("unread")) query.read = false;
    if (arguments.has("read")) query.read = true;
    if (arguments.has("unread") && arguments.has("read")) query.read.reset();
    if (arguments.has("flagged")) query.flagged = true;
    if (arguments.has("has-enclosure")) query.hasEnclosures = true;
    if (const auto since = arguments.value("since")) query.from = DateText::parse(*since, now);
    if (const auto until = arguments.value("until")) query.before = DateText::parse(*until, now);
    for (const std::string& search : arguments.values("search")) {
        std::istringstream words(search);
        for (std::string word; words >> word;) {
            query.words.push_back(word);
        }
    }
    query.author = arguments.value("author").value_or("");
    query.feeds = Names::feeds(client, arguments.values("feed"));
    setOrder(arguments, query);
    return query;
}

}  // namespace Commands
