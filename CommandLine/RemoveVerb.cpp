#include "RemoveVerb.h"

#include "CommonOptions.h"
#include "ListingWriter.h"
#include "Messages.h"
#include "Names.h"
#include "Session.h"

#include <algorithm>

namespace Commands {

namespace {

Listing::Row rowOf(const OVFeed& feed, long long entries) {
    return {{valueOf(feed.identifier()), entries, Names::titleOf(feed), valueOf(feed.URL())}};
}

long long entriesOf(const OVClient& client, const std::shared_ptr<OVFeed>& feed) {
    OVEntryQuery query;
    query.feeds = {feed};
    return static_cast<long long>(client.entryCount(query));
}

}  // namespace

const VerbSpec& RemoveVerb::getSpec() const {
    static const VerbSpec sSpec{
        .name = "rm",
        .summary = "unsubscribe from feeds",
        .operands = "FEED...",
        .fewest = 1,
        .most = VerbSpec::kAny,
        .kind = WordKind::Feed,
        .options = CommonOptions::join(
            {CommonOptions::dryRun(), CommonOptions::output(), CommonOptions::client()}),
        .details =
            "The feeds and their entries go, unless another application has subscribed to "
            "them. If one of the names names nothing, or several feeds, nothing is done at "
            "all. Shown is what went.",
        .examples = {"rm --dry-run \"Planet\"", "rm 3f9a21c"},
    };
    return sSpec;
}

ExitStatus RemoveVerb::run(const Arguments& arguments) {
    const Session session(arguments);
    std::vector<std::shared_ptr<OVFeed>> feeds =
        Names::feeds(session.client(), arguments.operands());
    std::sort(feeds.begin(), feeds.end());
    feeds.erase(std::unique(feeds.begin(), feeds.end()), feeds.end());
    Listing listing{"feeds",
                    {{"id", "ID", Listing::Column::Kind::Identifier},
                     {"entries", "ENTRIES", Listing::Column::Kind::Number},
                     {"title", "TITLE", Listing::Column::Kind::Flexible},
                     {"url", "URL", Listing::Column::Kind::Flexible}},
                    {}};
    std::size_t failed = 0;
    for (const std::shared_ptr<OVFeed>& feed : feeds) {
        Listing::Row row = rowOf(*feed, entriesOf(session.client(), feed));
        if (arguments.has("dry-run") || session.client().removeFeed(feed)) {
            listing.rows.push_back(std::move(row));
        } else {
            ++failed;
            Messages::complain("rm", "the agent could not remove " + Names::titleOf(*feed) +
                                         "; see \"orvane doctor\"");
        }
    }
    ListingWriter::write(listing, arguments);
    if (arguments.has("dry-run")) Messages::say("Nothing was done.");
    if (failed == 0) return ExitStatus::Done;
    return listing.rows.empty() ? ExitStatus::Failed : ExitStatus::PartlyFailed;
}

}  // namespace Commands
