#include "RefreshVerb.h"

#include "CommonOptions.h"
#include "EventLoop.h"
#include "ListingWriter.h"
#include "Messages.h"
#include "Names.h"
#include "Progress.h"
#include "RefreshWatch.h"
#include "Session.h"
#include "Terminal.h"
#include "Trouble.h"

namespace Commands {

namespace {

using Kind = Listing::Column::Kind;
using Feeds = std::vector<std::shared_ptr<OVFeed>>;

/// How many feeds came to which end.
struct Sums {
    std::size_t entries = 0;
    std::size_t withNew = 0;
    std::size_t unchanged = 0;
    std::size_t waiting = 0;
    std::size_t failed = 0;
    ExitStatus failure = ExitStatus::Failed;
};

Listing::Row rowOf(const OVFeed& feed, const char* result, std::size_t entries, Value detail,
                   Listing::Style style) {
    return {{valueOf(feed.identifier()), std::string(result), static_cast<long long>(entries),
             Names::titleOf(feed), std::move(detail), valueOf(feed.URL())},
            style};
}

Listing::Row resultOf(const RefreshWatch& watch, const RefreshWatch::Followed& each, Sums& sums) {
    const OVFeed& feed = *each.feed;
    if (each.state != RefreshWatch::State::Ended) {
        ++sums.waiting;
        return rowOf(feed, "waiting", 0, valueOf(feed.nextRefreshDate()), Listing::Style::Faint);
    }
    if (const std::optional<OVError> error = feed.lastError()) {
        ++sums.failed;
        sums.failure = Trouble::statusOf(*error);
        return rowOf(feed, "failed", 0, Trouble::textOf(*error), Listing::Style::Bad);
    }
    const std::size_t entries = watch.newEntries(each);
    sums.entries += entries;
    ++(entries > 0 ? sums.withNew : sums.unchanged);
    return entries > 0 ? rowOf(feed, "new", entries, {}, Listing::Style::Strong)
                       : rowOf(feed, "unchanged", 0, {}, Listing::Style::Plain);
}

std::string textOf(const Sums& sums) {
    std::string text = counted(sums.entries, "new entry", "new entries");
    if (sums.withNew > 0) text += " in " + counted(sums.withNew, "feed", "feeds");
    text += ", " + std::to_string(sums.unchanged) + " unchanged";
    if (sums.waiting > 0) text += ", " + std::to_string(sums.waiting) + " waiting";
    if (sums.failed > 0) text += ", " + std::to_string(sums.failed) + " failed";
    return text + '.';
}

ExitStatus statusOf(const Sums& sums) {
    if (sums.failed == 0) return ExitStatus::Done;
    const bool allFailed = sums.withNew + sums.unchanged + sums.waiting == 0;
    return allFailed ? sums.failure : ExitStatus::PartlyFailed;
}

void start(OVClient& client, const Feeds& feeds, bool isForced) {
    if (!isForced) return client.refreshFeeds(feeds);
    for (const std::shared_ptr<OVFeed>& feed : feeds) {
        std::optional<OVError> error;
        if (!feed->refresh(&error)) {
            throw Trouble::ofChange("cannot refresh " + Names::titleOf(*feed), error);
        }
    }
}

bool isForPeople(const Arguments& arguments) {
    return Terminal::isOutput() && !arguments.has("json") && !arguments.has("jsonl");
}

ExitStatus report(const RefreshWatch& watch, const Arguments& arguments) {
    Listing listing{"feeds",
                    {{"id", "ID", Kind::Identifier},
                     {"result", "RESULT"},
                     {"new", "NEW", Kind::Number},
                     {"title", "TITLE", Kind::Flexible},
                     {"detail", "WHY", Kind::Flexible},
                     {"url"}},
                    {}};
    Sums sums;
    for (const RefreshWatch::Followed& each : watch.feeds()) {
        const std::size_t unchanged = sums.unchanged;
        Listing::Row row = resultOf(watch, each, sums);
        const bool isNews = sums.unchanged == unchanged;
        if (isNews || !isForPeople(arguments)) listing.rows.push_back(std::move(row));
    }
    ListingWriter::write(listing, arguments);
    Messages::say(textOf(sums));
    return statusOf(sums);
}

}  // namespace

const VerbSpec& RefreshVerb::getSpec() const {
    static const VerbSpec sSpec{
        .name = "refresh",
        .summary = "look for new entries now",
        .operands = "[FEED...]",
        .most = VerbSpec::kAny,
        .kind = WordKind::Feed,
        .options = CommonOptions::join(
            {{{"force", 0, "", "Fetch the whole feed, even if the server says that nothing is new"},
              {"wait", 0, "", "Wait as well for feeds whose servers have asked for patience"},
              {"no-wait", 0, "", "Only ask the agent, and do not wait for what comes of it"}},
             CommonOptions::output(),
             CommonOptions::client()}),
        .details =
            "Has the agent refresh the feeds, or all there are, and says which have new entries, "
            "which are unchanged, which wait, and which failed and why. On a terminal there is a "
            "bar meanwhile, and feeds without anything new are left out.\n\n"
            "What takes longer goes on without this program: an interrupt ends the waiting, not "
            "the refresh. The exit status is 4 if some feeds failed.",
        .examples = {"refresh", "refresh --force \"Planet\"", "refresh --jsonl"},
    };
    return sSpec;
}

ExitStatus RefreshVerb::run(const Arguments& arguments) {
    const Session session(arguments);
    OVClient& client = session.client();
    const bool areNamed = !arguments.operands().empty();
    const Feeds feeds = areNamed ? Names::feeds(client, arguments.operands()) : client.feeds();
    if (feeds.empty()) {
        Messages::say("No feeds yet. To subscribe to one: orvane add URL");
        return ExitStatus::NothingMatched;
    }
    RefreshWatch watch(client, feeds);
    start(client, feeds, arguments.has("force"));
    if (arguments.has("no-wait")) return ExitStatus::Done;
    {
        const Progress progress;
        progress.show(0, feeds.size());
        watch.wait(arguments.has("wait"), [&] { progress.show(watch.endedCount(), feeds.size()); });
    }
    return report(watch, arguments);
}

}  // namespace Commands
