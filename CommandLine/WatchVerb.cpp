#include "WatchVerb.h"

#include "CommonOptions.h"
#include "EventLoop.h"
#include "EventRecorder.h"
#include "ListingJSON.h"
#include "ListingText.h"
#include "Messages.h"
#include "Names.h"
#include "Output.h"
#include "Session.h"

#include <algorithm>
#include <cstdlib>

namespace Commands {

namespace {

/// Has the shell run a command for an event, which it is told by its environment.
void execute(const std::string& command, const Listing& events, const Listing::Row& row) {
    constexpr std::pair<const char*, const char*> kVariables[] = {
        {"time", "ORVANE_TIME"},      {"event", "ORVANE_EVENT"},      {"id", "ORVANE_ENTRY"},
        {"feed", "ORVANE_FEED"},      {"title", "ORVANE_TITLE"},      {"url", "ORVANE_URL"},
        {"feedId", "ORVANE_FEED_ID"}, {"feedUrl", "ORVANE_FEED_URL"}, {"unread", "ORVANE_UNREAD"}};
    for (std::size_t i = 0; i < events.columns.size(); ++i) {
        for (const auto& [key, variable] : kVariables) {
            if (std::string(key) != events.columns[i].key) continue;
            setenv(variable, ListingText::plain(row.values[i]).c_str(), 1);
        }
    }
    if (std::system(command.c_str()) != 0) {
        Messages::complain("watch", "the command failed: " + command);
    }
}

void show(const Listing& events, const Arguments& arguments) {
    if (const std::optional<std::string> command = arguments.value("exec")) {
        for (const Listing::Row& row : events.rows) {
            execute(*command, events, row);
        }
        return;
    }
    const bool isJSON = arguments.has("json") || arguments.has("jsonl");
    Output::write(isJSON ? ListingJSON::lines(events) : ListingText::lines(events));
}

}  // namespace

const VerbSpec& WatchVerb::getSpec() const {
    static const VerbSpec sSpec{
        .name = "watch",
        .summary = "show events as they come",
        .operands = "[FEED...]",
        .most = VerbSpec::kAny,
        .kind = WordKind::Feed,
        .options = CommonOptions::join(
            {{{"event",
               'e',
               "EVENT",
               "Only events of this name; may be given several times",
               WordKind::Choice,
               {"added", "changed", "removed", "flags", "unread", "refresh-began",
                "refresh-ended"}},
              {"number", 'n', "N", "End after so many events"},
              {"exec", 'x', "COMMAND", "Have the shell run this for each event"},
              {"json", 0, "", "A JSON object on each line"},
              {"jsonl", 0, "", "The same"}},
             CommonOptions::client()}),
        .details =
            "A line for each event: the time, what happened, the identifier of the entry, the "
            "feed, "
            "the title and the URL. Events are: added, changed, removed and flags of entries; "
            "unread, when a feed's count of unread entries changes; refresh-began and "
            "refresh-ended.\n\n"
            "The command of --exec finds the event in ORVANE_EVENT, ORVANE_TIME, ORVANE_ENTRY, "
            "ORVANE_FEED, ORVANE_TITLE, ORVANE_URL, ORVANE_FEED_ID, ORVANE_FEED_URL and "
            "ORVANE_UNREAD. Events that come while it runs wait.\n\n"
            "It goes on until it is interrupted, or has shown as many events as --number says.",
        .examples = {"watch -e added --exec 'notify-send \"$ORVANE_FEED\" \"$ORVANE_TITLE\"'",
                     "watch --jsonl | jq .title"},
    };
    return sSpec;
}

ExitStatus WatchVerb::run(const Arguments& arguments) {
    const std::size_t most = arguments.number("number").value_or(0);
    const std::vector<std::string> wanted = arguments.values("event");
    const Session session(arguments);
    // The objects of all feeds must be there for what happens to them to be told.
    const std::vector<std::shared_ptr<OVFeed>> all = session.client().feeds();
    for (const std::shared_ptr<OVFeed>& feed : all) {
        feed->unreadCount();
    }
    EventRecorder recorder(session.client(), Names::feeds(session.client(), arguments.operands()));
    std::size_t shown = 0;
    while (!EventLoop::isInterrupted() && (most == 0 || shown < most)) {
        EventLoop::turnUntil([&] { return recorder.hasEvents(); }, -1);
        Listing events = recorder.take();
        std::erase_if(events.rows, [&](const Listing::Row& row) {
            const std::string& event = std::get<std::string>(row.values[1]);
            return !wanted.empty() &&
                   std::find(wanted.begin(), wanted.end(), event) == wanted.end();
        });
        if (most > 0) events.rows.resize(std::min(events.rows.size(), most - shown));
        if (events.rows.empty()) continue;
        show(events, arguments);
        shown += events.rows.size();
    }
    return ExitStatus::Done;
}

}  // namespace Commands
