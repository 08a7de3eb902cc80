#include "EntryListing.h"

#include "Names.h"

#include <Orvane/OVEnclosure.h>
#include <Orvane/OVFeed.h>

namespace Commands {

namespace {

using Kind = Listing::Column::Kind;

std::string stateOf(bool isRead, bool isFlagged) {
    return std::string(isRead ? " " : "\u25CF") + (isFlagged ? "\u2605" : " ");
}

Value enclosuresOf(const OVEntry& entry) {
    std::vector<std::string> urls;
    for (const std::shared_ptr<OVEnclosure>& each : entry.enclosures()) {
        urls.push_back(each->URL().value_or(""));
    }
    return urls;
}

Listing::Row rowOf(const OVEntry& entry, EntryListing::Extent extent) {
    const std::shared_ptr<OVFeed> feed = entry.feed();
    const bool isRead = entry.isRead();
    const bool isFlagged = entry.isFlagged();
    const bool isComplete = extent == EntryListing::Extent::Complete;
    return {
        {valueOf(entry.identifier()), stateOf(isRead, isFlagged), valueOf(entry.dateForDisplay()),
         feed ? Value(Names::titleOf(*feed)) : Value(), entry.titleForDisplay(),
         valueOf(entry.alternateURL()), isRead, isFlagged, valueOf(entry.localDateCreated()),
         valueOf(entry.datePublished()), valueOf(entry.dateUpdated()),
         feed ? valueOf(feed->identifier()) : Value(), feed ? valueOf(feed->URL()) : Value(),
         isComplete ? Value(entry.authorsForDisplay()) : Value(),
         isComplete ? enclosuresOf(entry) : Value()},
        isRead ? Listing::Style::Plain : Listing::Style::Strong};
}

}  // namespace

Listing EntryListing::of(const OVEntry::List& entries, Extent extent) {
    Listing listing{"entries",
                    {{"id", "ID", Kind::Identifier},
                     {"state", "  "},
                     {"date", "DATE"},
                     {"feed", "FEED", Kind::Flexible},
                     {"title", "TITLE", Kind::Flexible},
                     {"url"},
                     {"read"},
                     {"flagged"},
                     {"received"},
                     {"published"},
                     {"updated"},
                     {"feedId"},
                     {"feedUrl"},
                     {"authors"},
                     {"enclosures"}},
                    {}};
    for (const std::shared_ptr<OVEntry>& entry : entries) {
        listing.rows.push_back(rowOf(*entry, extent));
    }
    return listing;
}

}  // namespace Commands
