#include "StatusVerb.h"

#include "AgentProbe.h"
#include "CommonOptions.h"
#include "ListingWriter.h"
#include "Places.h"
#include "Session.h"

#include <algorithm>

namespace Commands {

namespace {

using Kind = Listing::Column::Kind;

const char* nameOf(AgentProbe::State state) {
    switch (state) {
        case AgentProbe::State::Runs:
            return "running";
        case AgentProbe::State::Stopped:
            return "not running, started when needed";
        case AgentProbe::State::NoBus:
            break;
    }
    return "not reachable: no message bus";
}

long long count(const OVClient& client, std::optional<bool> read, std::optional<bool> flagged) {
    OVEntryQuery query;
    query.read = read;
    query.flagged = flagged;
    return static_cast<long long>(client.entryCount(query));
}

/// What all feeds say together.
struct Feeds {
    long long number = 0;
    long long failing = 0;
    std::optional<OVDate> next;
    std::optional<OVDate> last;
};

Feeds sumOf(const OVClient& client) {
    Feeds sum;
    for (const std::shared_ptr<OVFeed>& feed : client.feeds()) {
        ++sum.number;
        if (feed->lastError()) ++sum.failing;
        const auto next = feed->nextRefreshDate();
        if (next && (!sum.next || *next < *sum.next)) sum.next = next;
        const auto last = feed->lastRefreshDate();
        if (last && (!sum.last || *sum.last < *last)) sum.last = last;
    }
    return sum;
}

}  // namespace

const VerbSpec& StatusVerb::getSpec() const {
    static const VerbSpec sSpec{
        .name = "status",
        .summary = "show the agent, counts and disk space",
        .options = CommonOptions::join({CommonOptions::output(), CommonOptions::client()}),
        .details =
            "Whether the agent runs, when it next has a feed to refresh, how many feeds and "
            "entries there are, and what they take on the disk. Nothing is started for it.",
        .examples = {"status", "status --json | jq .unread"},
    };
    return sSpec;
}

ExitStatus StatusVerb::run(const Arguments& arguments) {
    // Before the session, which may start the agent.
    const AgentProbe::State agent = AgentProbe::look();
    const Session session(arguments);
    const Feeds feeds = sumOf(session.client());
    const auto bytes = [](const std::filesystem::path& path) {
        return static_cast<long long>(Places::size(path));
    };
    const Listing listing{
        "status",
        {{"agent", "Agent"},
         {"nextRefresh", "Next refresh"},
         {"lastRefresh", "Last refresh"},
         {"client", "Client"},
         {"feeds", "Feeds"},
         {"failing", "Failing"},
         {"entries", "Entries"},
         {"unread", "Unread"},
         {"flagged", "Flagged"},
         {"storage", "Storage"},
         {"databaseBytes", "Database", Kind::Bytes},
         {"storageBytes", "All files", Kind::Bytes}},
        {{{std::string(nameOf(agent)), valueOf(feeds.next), valueOf(feeds.last),
           session.clientName(), feeds.number, feeds.failing,
           count(session.client(), std::nullopt, std::nullopt),
           count(session.client(), false, std::nullopt),
           count(session.client(), std::nullopt, true), Places::storage().string(),
           bytes(Places::database()), bytes(Places::storage())}}}};
    ListingWriter::writeObject(listing, arguments);
    return ExitStatus::Done;
}

}  // namespace Commands
