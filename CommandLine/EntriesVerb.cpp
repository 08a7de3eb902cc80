#include "EntriesVerb.h"

#include "CommonOptions.h"
#include "EntryListing.h"
#include "EntrySelection.h"
#include "ListingWriter.h"
#include "Messages.h"
#include "Names.h"
#include "Output.h"
#include "RowFormat.h"
#include "Session.h"
#include "Terminal.h"

namespace Commands {

namespace {

/// How many are shown on a terminal if nothing else is said.
constexpr std::size_t kOnTerminal = 50;

bool isForPeople(const Arguments& arguments) {
    return Terminal::isOutput() && !arguments.has("json") && !arguments.has("jsonl") &&
           !arguments.has("quiet") && !arguments.has("format");
}

void write(const OVEntry::List& entries, const Arguments& arguments) {
    if (arguments.has("quiet")) {
        std::string identifiers;
        for (const std::shared_ptr<OVEntry>& each : entries) {
            identifiers += each->identifier().value_or("") + '\n';
        }
        return Output::write(identifiers);
    }
    const std::optional<std::string> format = arguments.value("format");
    const bool isComplete = format || arguments.has("json") || arguments.has("jsonl");
    const Listing listing = EntryListing::of(
        entries, isComplete ? EntryListing::Extent::Complete : EntryListing::Extent::Lines);
    if (format) return Output::write(RowFormat::expand(*format, listing));
    ListingWriter::write(listing, arguments);
}

}  // namespace

const VerbSpec& EntriesVerb::getSpec() const {
    static const VerbSpec sSpec{
        .name = "entries",
        .summary = "list entries",
        .operands = "[FEED...]",
        .most = VerbSpec::kAny,
        .kind = WordKind::Feed,
        .options = CommonOptions::join(
            {EntrySelection::options(),
             {{"sort",
               's',
               "ORDER",
               "received, published, title or feed",
               WordKind::Choice,
               {"received", "published", "title", "feed"}},
              {"reverse", 'r', "", "The other way round"},
              {"number", 'n', "N",
               "At most so many; 0 for all. On a terminal it is 50 without this"},
              {"format", 0, "FORMAT", "A line for each by this: \"{title} <{url}>\""},
              {"quiet", 'q', "", "Only identifiers"}},
             CommonOptions::output(),
             CommonOptions::client()}),
        .details =
            "The newest come first: by when they were first seen here, or with --sort published by "
            "the date that the feed gives them, which --since and --until then go by as well. "
            "Words "
            "and names are found as parts of others, without regard to case in ASCII.\n\n"
            "The keys of --format are those of the objects that --json writes; \\n and \\t stand "
            "for "
            "a line end and a tab.\n\n"
            "The exit status is 1 if no entry is found.",
        .examples = {"entries --unread --since today", "entries -q --feed \"Planet\" --until 30d",
                     "entries --search \"tidal power\" --format '{published}\\t{title}'"},
    };
    return sSpec;
}

ExitStatus EntriesVerb::run(const Arguments& arguments) {
    const Session session(arguments);
    OVEntryQuery query = EntrySelection::query(arguments, session.client());
    for (auto& feed : Names::feeds(session.client(), arguments.operands())) {
        query.feeds.push_back(std::move(feed));
    }
    const bool isCut = !arguments.has("number") && isForPeople(arguments);
    query.limit = arguments.number("number").value_or(isCut ? kOnTerminal : 0);
    const OVEntry::List entries = session.client().entries(query);
    write(entries, arguments);
    if (entries.empty()) {
        Messages::say("No such entries.");
        return ExitStatus::NothingMatched;
    }
    const std::size_t all = isCut ? session.client().entryCount(query) : entries.size();
    if (all > entries.size()) {
        Messages::say(std::to_string(entries.size()) + " of " + std::to_string(all) +
                      " are shown; -n 0 shows all.");
    }
    return ExitStatus::Done;
}

}  // namespace Commands
