#include "ListingWriter.h"

#include "DateText.h"
#include "ListingJSON.h"
#include "ListingText.h"
#include "Output.h"
#include "Terminal.h"

#include <utility>

namespace Commands {

namespace {

ListingText::Look look() {
    return {Terminal::width(), Terminal::hasColours(), DateText::now()};
}

/// A row for each value that has a title. `now` is null where the values are for programs.
Listing turned(const Listing& listing, const OVDate* now) {
    Listing values{
        listing.name, {{"name", " "}, {"value", " ", Listing::Column::Kind::Flexible}}, {}};
    const Listing::Row& row = listing.rows.at(0);
    for (std::size_t i = 0; i < listing.columns.size(); ++i) {
        const Listing::Column& column = listing.columns[i];
        if (!column.title[0]) continue;
        Value value = row.values[i];
        if (now) value = ListingText::shown(value, column.kind, *now);
        values.rows.push_back({{column.title, std::move(value)}, row.style});
    }
    return values;
}

}  // namespace

void ListingWriter::write(const Listing& listing, const Arguments& arguments) {
    if (arguments.has("jsonl")) return Output::write(ListingJSON::lines(listing));
    if (arguments.has("json")) return Output::write(ListingJSON::document(listing));
    if (!Terminal::isOutput()) return Output::write(ListingText::lines(listing));
    if (!listing.rows.empty()) Output::write(ListingText::table(listing, look()));
}

void ListingWriter::writeObject(const Listing& listing, const Arguments& arguments) {
    if (arguments.has("jsonl")) return Output::write(ListingJSON::lines(listing));
    if (arguments.has("json")) return Output::write(ListingJSON::object(listing));
    if (!Terminal::isOutput()) return Output::write(ListingText::lines(turned(listing, nullptr)));
    const ListingText::Look terminal = look();
    const std::string table = ListingText::table(turned(listing, &terminal.now), terminal);
    Output::write(table.substr(table.find('\n') + 1));
}

}  // namespace Commands
