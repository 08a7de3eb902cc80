#include "FeedsVerb.h"

#include "CommonOptions.h"
#include "ListingWriter.h"
#include "Messages.h"
#include "Names.h"
#include "Session.h"
#include "TextLayout.h"
#include "Trouble.h"

#include <algorithm>
#include <utility>

namespace Commands {

namespace {

using Kind = Listing::Column::Kind;
using Feeds = std::vector<std::shared_ptr<OVFeed>>;

Value errorOf(const OVFeed& feed) {
    const std::optional<OVError> error = feed.lastError();
    return error ? Value(Trouble::textOf(*error)) : Value();
}

Listing::Row rowOf(const OVFeed& feed) {
    const int unread = feed.unreadCount();
    const Value error = errorOf(feed);
    const bool isBad = !std::holds_alternative<std::monostate>(error);
    const auto quiet = unread > 0 ? Listing::Style::Strong : Listing::Style::Plain;
    return {{valueOf(feed.identifier()), static_cast<long long>(unread), Names::titleOf(feed),
             valueOf(feed.localDateCreatedOfNewestEntry()), valueOf(feed.nextRefreshDate()), error,
             valueOf(feed.URL()), valueOf(feed.alternateURL()), valueOf(feed.lastRefreshDate()),
             valueOf(feed.subtitle()), valueOf(feed.login())},
            isBad ? Listing::Style::Bad : quiet};
}

}  // namespace

const VerbSpec& FeedsVerb::getSpec() const {
    static const VerbSpec sSpec{
        .name = "feeds",
        .summary = "list the feeds that are subscribed to",
        .operands = "[FEED...]",
        .most = VerbSpec::kAny,
        .kind = WordKind::Feed,
        .options =
            CommonOptions::join({{{"unread", 'u', "", "Only feeds with unread entries"},
                                  {"failing", 0, "", "Only feeds whose last refresh failed"}},
                                 CommonOptions::output(),
                                 CommonOptions::client()}),
        .details =
            "A line for each feed: its identifier, how many entries are unread, its title, "
            "when it last had a new entry, when it will be refreshed next, and what went "
            "wrong with the last refresh. The exit status is 1 if there is nothing to list.",
        .examples = {"feeds --unread", "feeds --json | jq -r '.feeds[].url'"},
    };
    return sSpec;
}

Feeds FeedsVerb::sorted(Feeds feeds) {
    std::vector<std::pair<std::string, std::shared_ptr<OVFeed>>> keyed;
    for (const std::shared_ptr<OVFeed>& feed : feeds) {
        keyed.emplace_back(TextLayout::folded(Names::titleOf(*feed)), feed);
    }
    std::stable_sort(keyed.begin(), keyed.end(),
                     [](const auto& a, const auto& b) { return a.first < b.first; });
    for (std::size_t i = 0; i < feeds.size(); ++i) {
        feeds[i] = keyed[i].second;
    }
    return feeds;
}

Listing FeedsVerb::list(const Feeds& feeds) {
    Listing listing{"feeds",
                    {{"id", "ID", Kind::Identifier},
                     {"unread", "UNREAD", Kind::Number},
                     {"title", "TITLE", Kind::Flexible},
                     {"lastNew", "LAST NEW"},
                     {"nextDue", "NEXT DUE"},
                     {"error", "ERROR", Kind::Flexible},
                     {"url"},
                     {"page"},
                     {"refreshed"},
                     {"subtitle"},
                     {"login"}},
                    {}};
    for (const std::shared_ptr<OVFeed>& feed : sorted(feeds)) {
        listing.rows.push_back(rowOf(*feed));
    }
    return listing;
}

ExitStatus FeedsVerb::run(const Arguments& arguments) {
    const Session session(arguments);
    Feeds feeds = arguments.operands().empty()
                      ? session.client().feeds()
                      : Names::feeds(session.client(), arguments.operands());
    if (arguments.has("unread")) {
        std::erase_if(feeds, [](const auto& feed) { return feed->unreadCount() == 0; });
    }
    if (arguments.has("failing")) {
        std::erase_if(feeds, [](const auto& feed) { return !feed->lastError(); });
    }
    ListingWriter::write(list(feeds), arguments);
    if (!feeds.empty()) return ExitStatus::Done;
    const bool hasAny = arguments.has("unread") || arguments.has("failing");
    Messages::say(hasAny ? "No such feeds." : "No feeds yet. To subscribe to one: orvane add URL");
    return ExitStatus::NothingMatched;
}

}  // namespace Commands
