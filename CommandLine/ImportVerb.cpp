#include "ImportVerb.h"

#include "CommonOptions.h"
#include "Failure.h"
#include "InputFile.h"
#include "ListingWriter.h"
#include "Messages.h"
#include "OPML.h"
#include "OutlineStore.h"
#include "Session.h"
#include "Trouble.h"

#include <Orvane/OVException.h>
#include <Orvane/OVFeedURLUtils.h>

#include <set>
#include <system_error>

namespace Commands {

namespace {

using Kind = Listing::Column::Kind;
using Outlines = std::vector<Outline>;

std::string contentOf(const std::string& file) {
    try {
        return InputFile::read(file);
    } catch (const std::system_error& failure) {
        throw Failure(ExitStatus::Failed, failure.what());
    }
}

/// Subscribes to the feeds of outlines, each on its own.
class Importer {
 public:
    Importer(OVClient& client, bool isDry) : mClient(client), mIsDry(isDry) {}

    /// Gives what was imported, with the URLs that were subscribed to.
    Outlines import(const Outlines& outlines, const std::string& folder = {}) {
        Outlines done;
        for (const Outline& each : outlines) {
            Outline outline = each;
            if (each.isFeed()) {
                if (!subscribe(outline, folder)) continue;
            } else {
                const std::string path = folder.empty() ? each.title : folder + '/' + each.title;
                outline.children = import(each.children, path);
                if (outline.children.empty()) continue;
            }
            done.push_back(std::move(outline));
        }
        return done;
    }

    const Listing& report() const { return mReport; }
    const std::vector<std::shared_ptr<OVFeed>>& added() const { return mAdded; }
    std::size_t addedCount() const { return mAddedCount; }
    std::size_t badCount() const { return mBadCount; }

 private:
    bool subscribe(Outline& outline, const std::string& folder) {
        const std::string written = outline.url;
        try {
            if (OVFeedURLUtils::_webIsFeedProtocolURL(written)) {
                outline.url = OVFeedURLUtils::sourceURLForFeedURL(written).value_or(written);
            }
            const std::shared_ptr<OVFeed> known = mClient.feedWithURL(outline.url);
            // Subscribed to, it has the form that the library gives it.
            if (known) outline.url = known->URL().value_or(outline.url);
            const bool isKnown = known || mSeen.contains(outline.url);
            if (!isKnown) add(outline);
            tell(isKnown ? "known" : "added", outline, folder, {}, Listing::Style::Plain);
            return true;
        } catch (const Failure& failure) {
            // Of an agent that cannot be reached, nothing is to be hoped for the next one.
            if (failure.getStatus() == ExitStatus::NoAgent) throw;
            ++mBadCount;
            tell("bad", outline, folder, std::string(failure.what()), Listing::Style::Bad);
        } catch (const OVException& wrong) {
            ++mBadCount;
            tell("bad", outline, folder, std::string(wrong.what()), Listing::Style::Bad);
        }
        return false;
    }

    void add(Outline& outline) {
        const std::string written = outline.url;
        // Subscribing would refuse it as well, but not in a dry run.
        const bool isFetchable = OVFeed::create(outline.url) != nullptr;
        if (!isFetchable) throw Failure(ExitStatus::Failed, "feeds cannot be fetched from there");
        if (!mIsDry) {
            std::optional<OVError> error;
            const std::shared_ptr<OVFeed> feed = mClient.addFeedWithURL(outline.url, &error);
            if (!feed) throw Trouble::ofChange("cannot subscribe", error);
            outline.url = feed->URL().value_or(outline.url);
            mAdded.push_back(feed);
        }
        mSeen.insert(written);
        ++mAddedCount;
    }

    void tell(const char* result, const Outline& outline, const std::string& folder, Value reason,
              Listing::Style style) {
        mReport.rows.push_back(
            {{std::string(result), outline.title, outline.url, folder, std::move(reason)}, style});
    }

    OVClient& mClient;
    bool mIsDry;
    std::set<std::string> mSeen;  ///< in the file, as they are written there
    std::vector<std::shared_ptr<OVFeed>> mAdded;
    std::size_t mAddedCount = 0;
    std::size_t mBadCount = 0;
    Listing mReport{"outlines",
                    {{"result", "RESULT"},
                     {"title", "TITLE", Kind::Flexible},
                     {"url", "URL", Kind::Flexible},
                     {"folder", "FOLDER", Kind::Flexible},
                     {"reason", "WHY", Kind::Flexible}},
                    {}};
};

ExitStatus statusOf(const Importer& importer) {
    if (importer.badCount() == 0) return ExitStatus::Done;
    const bool allWereBad = importer.badCount() == importer.report().rows.size();
    return allWereBad ? ExitStatus::Failed : ExitStatus::PartlyFailed;
}

}  // namespace

const VerbSpec& ImportVerb::getSpec() const {
    static const VerbSpec sSpec{
        .name = "import",
        .summary = "subscribe to the feeds of an OPML file",
        .operands = "FILE|-",
        .fewest = 1,
        .most = 1,
        .kind = WordKind::File,
        .options = CommonOptions::join(
            {{{"no-fetch", 0, "", "Leave it to the agent when to fetch the feeds"}},
             CommonOptions::dryRun(),
             CommonOptions::output(),
             CommonOptions::client()}),
        .details =
            "The file is OPML 1.0 to 2.0, of whatever quality, or a list of URLs, one a line. "
            "\"-\" is "
            "standard input. A line is written for each feed: added, known, or bad and why; a bad "
            "one keeps no other from being added.\n\n"
            "Folders, titles and attributes that orvane has no use for are kept in a file of its "
            "own beside the database, and come back with \"orvane export\". Folders of the same "
            "name become one.\n\n"
            "The agent begins to fetch what is new; nobody waits for that. The exit status is 1 if "
            "there are no feeds in the file, and 4 if some lines were bad.",
        .examples = {"import subscriptions.opml", "import --dry-run - < feeds.opml"},
    };
    return sSpec;
}

ExitStatus ImportVerb::run(const Arguments& arguments) {
    const std::optional<Outlines> outlines = OPML::read(contentOf(arguments.operands()[0]));
    if (!outlines) {
        Messages::complain("import", "there are no feeds in " + arguments.operands()[0]);
        return ExitStatus::NothingMatched;
    }
    const bool isDry = arguments.has("dry-run");
    const Session session(arguments);
    Importer importer(session.client(), isDry);
    const Outlines done = importer.import(*outlines);
    if (!isDry && !done.empty()) {
        OutlineStore store(session.clientName());
        store.merge(done);
        store.save();
    }
    const bool isFetched = !importer.added().empty() && !arguments.has("no-fetch");
    if (isFetched) session.client().refreshFeeds(importer.added());
    ListingWriter::write(importer.report(), arguments);
    const std::size_t all = importer.report().rows.size();
    Messages::say(counted(importer.addedCount(), "feed", "feeds") + " added, " +
                  std::to_string(all - importer.addedCount() - importer.badCount()) + " known, " +
                  std::to_string(importer.badCount()) + " bad." +
                  (isDry ? " Nothing was done." : ""));
    return statusOf(importer);
}

}  // namespace Commands
