#include "AddVerb.h"

#include "CommonOptions.h"
#include "Discovery.h"
#include "ListingWriter.h"
#include "Messages.h"
#include "Names.h"
#include "Progress.h"
#include "RefreshWatch.h"
#include "Session.h"
#include "Trouble.h"

#include <Orvane/OVException.h>

#include <unistd.h>

#include <iostream>

namespace Commands {

namespace {

using Kind = Listing::Column::Kind;
using Candidates = std::vector<Discovery::Candidate>;

std::string listOf(const Candidates& candidates) {
    std::string text;
    for (std::size_t i = 0; i < candidates.size(); ++i) {
        text += "\n  " + std::to_string(i + 1) + "  " + candidates[i].url;
        if (!candidates[i].title.empty()) text += "  (" + candidates[i].title + ')';
    }
    return text;
}

/// Asks the user at the terminal which of the feeds of a page are wanted.
Candidates askFor(const std::string& page, const Candidates& candidates) {
    Messages::say(page + " links to several feeds:" + listOf(candidates));
    std::cerr << "Which one (1 to " << candidates.size() << ", a for all)? " << std::flush;
    std::string answer;
    std::getline(std::cin, answer);
    if (answer == "a") return candidates;
    for (std::size_t i = 0; i < candidates.size(); ++i) {
        if (answer == std::to_string(i + 1)) return {candidates[i]};
    }
    throw Failure(ExitStatus::UnknownName, "none of the feeds was chosen");
}

Candidates chosen(const std::string& page, const Candidates& candidates,
                  const Arguments& arguments) {
    if (candidates.size() == 1 || arguments.has("all")) return candidates;
    if (arguments.has("first")) return {candidates[0]};
    if (isatty(STDIN_FILENO) == 1 && isatty(STDERR_FILENO) == 1) return askFor(page, candidates);
    throw Failure(ExitStatus::UnknownName,
                  page + " links to several feeds; name one of them, or use --all or --first:" +
                      listOf(candidates));
}

/// Subscribes to what words name, one after the other.
class Subscriber {
 public:
    Subscriber(OVClient& client, const Arguments& arguments)
        : mClient(client), mArguments(arguments) {}

    void add(const std::string& word) {
        try {
            for (const std::string& source : Discovery::sourcesOf(word)) {
                addSource(source);
            }
        } catch (const Failure& failure) {
            fail(failure.getStatus(), failure.what());
        } catch (const OVException& wrong) {
            fail(ExitStatus::Usage, wrong.what());
        }
    }

    /// Fetches what was subscribed to.
    void fetch() {
        if (mAdded.empty()) return;
        RefreshWatch watch(mClient, mAdded);
        for (const std::shared_ptr<OVFeed>& feed : mAdded) {
            std::optional<OVError> error;
            if (!feed->refresh(&error)) {
                const auto trouble =
                    Trouble::ofChange("cannot fetch " + Names::titleOf(*feed), error);
                fail(trouble.getStatus(), trouble.what());
            }
        }
        const Progress progress;
        watch.wait(false, [&] { progress.show(watch.endedCount(), mAdded.size()); });
    }

    Listing list() {
        Listing listing{"feeds",
                        {{"id", "ID", Kind::Identifier},
                         {"entries", "ENTRIES", Kind::Number},
                         {"title", "TITLE", Kind::Flexible},
                         {"url", "URL", Kind::Flexible},
                         {"error"}},
                        {}};
        for (const std::shared_ptr<OVFeed>& feed : mAdded) {
            OVEntryQuery query;
            query.feeds = {feed};
            const auto error = feed->lastError();
            if (error) fail(Trouble::statusOf(*error), Trouble::textOf(*error));
            listing.rows.push_back(
                {{valueOf(feed->identifier()), static_cast<long long>(mClient.entryCount(query)),
                  Names::titleOf(*feed), valueOf(feed->URL()),
                  error ? Value(Trouble::textOf(*error)) : Value()}});
        }
        return listing;
    }

    ExitStatus status() const {
        if (mFailures == 0) return ExitStatus::Done;
        return mAdded.empty() && mKnown == 0 ? mFailure : ExitStatus::PartlyFailed;
    }

 private:
    void addSource(const std::string& source) {
        if (const auto known = mClient.feedWithURL(source)) return tellKnown(*known);
        if (mArguments.has("force")) return subscribe(source);
        const Discovery::Result found = Discovery::find(source);
        if (found.feeds.empty()) {
            const auto trouble = Trouble::ofChange(source, found.error);
            throw Failure(trouble.getStatus(),
                          std::string(trouble.what()) +
                              "\n  To subscribe to it all the same: orvane add --force " + source);
        }
        for (const Discovery::Candidate& each : chosen(source, found.feeds, mArguments)) {
            subscribe(each.url);
        }
    }

    void subscribe(const std::string& url) {
        if (const auto known = mClient.feedWithURL(url)) return tellKnown(*known);
        std::optional<OVError> error;
        const std::shared_ptr<OVFeed> feed = mClient.addFeedWithURL(url, &error);
        if (!feed) throw Trouble::ofChange("cannot subscribe to " + url, error);
        mAdded.push_back(feed);
    }

    void tellKnown(const OVFeed& feed) {
        ++mKnown;
        Messages::say("Already subscribed to " + Names::titleOf(feed) + '.');
    }

    void fail(ExitStatus status, const std::string& text) {
        ++mFailures;
        mFailure = status;
        Messages::complain("add", text);
    }

    OVClient& mClient;
    const Arguments& mArguments;
    std::vector<std::shared_ptr<OVFeed>> mAdded;
    std::size_t mKnown = 0;
    std::size_t mFailures = 0;
    ExitStatus mFailure = ExitStatus::Failed;
};

}  // namespace

const VerbSpec& AddVerb::getSpec() const {
    static const VerbSpec sSpec{
        .name = "add",
        .summary = "subscribe to feeds",
        .operands = "URL...",
        .fewest = 1,
        .most = VerbSpec::kAny,
        .options = CommonOptions::join(
            {{{"all", 'a', "", "Of a page that links to several feeds, all"},
              {"first", 0, "", "Of such a page, the first"},
              {"force", 0, "", "Subscribe without looking whether there is a feed"},
              {"no-fetch", 0, "", "Leave it to the agent when to fetch it"}},
             CommonOptions::output(),
             CommonOptions::client()}),
        .details =
            "A URL may be that of a feed, of a page that links to feeds, of one of the forms "
            "\"feed:\" and \"feeds:\", or a file. Without a scheme, https:// is put in front. The "
            "feeds "
            "are fetched, and shown with the number of their entries.\n\n"
            "Where a page links to several feeds, you are asked which you want; without a terminal "
            "the exit status is 3, unless there is --all or --first. A feed that wants a login is "
            "one for --force: then give it one with \"orvane set FEED login NAME password -\".",
        .examples = {"add https://example.org/", "add --all example.org example.net/feed.xml"},
    };
    return sSpec;
}

ExitStatus AddVerb::run(const Arguments& arguments) {
    const Session session(arguments);
    Subscriber subscriber(session.client(), arguments);
    for (const std::string& word : arguments.operands()) {
        subscriber.add(word);
    }
    if (!arguments.has("no-fetch")) subscriber.fetch();
    const Listing listing = subscriber.list();
    ListingWriter::write(listing, arguments);
    return subscriber.status();
}

}  // namespace Commands
