#include "ExportVerb.h"

#include "CommonOptions.h"
#include "DateText.h"
#include "FeedsVerb.h"
#include "ListingWriter.h"
#include "Messages.h"
#include "Names.h"
#include "OPML.h"
#include "OutlineStore.h"
#include "Output.h"
#include "Session.h"

namespace Commands {

namespace {

using Outlines = std::vector<Outline>;

Outlines outlinesOf(const std::vector<std::shared_ptr<OVFeed>>& feeds) {
    Outlines all;
    for (const std::shared_ptr<OVFeed>& feed : feeds) {
        Outline outline;
        outline.title = Names::titleOf(*feed);
        outline.url = feed->URL().value_or("");
        outline.page = feed->alternateURL().value_or("");
        all.push_back(std::move(outline));
    }
    return all;
}

void addRows(const Outlines& outlines, const std::string& folder, Listing& listing) {
    for (const Outline& each : outlines) {
        if (each.isFeed()) {
            listing.rows.push_back({{each.title, each.url, each.page, folder}});
        } else {
            addRows(each.children, folder.empty() ? each.title : folder + '/' + each.title,
                    listing);
        }
    }
}

}  // namespace

const VerbSpec& ExportVerb::getSpec() const {
    static const VerbSpec sSpec{
        .name = "export",
        .summary = "write the subscriptions as OPML",
        .operands = "[FEED...]",
        .most = VerbSpec::kAny,
        .kind = WordKind::Feed,
        .options = CommonOptions::join({{{"flat", 0, "", "Without folders"}},
                                        CommonOptions::output(),
                                        CommonOptions::client()}),
        .details =
            "Writes an OPML 2.0 document with all feeds, or those that are named, in the "
            "folders and with the attributes that they were imported with.",
        .examples = {"export > subscriptions.opml", "export --json | jq -r '.feeds[].folder'"},
    };
    return sSpec;
}

ExitStatus ExportVerb::run(const Arguments& arguments) {
    const Session session(arguments);
    const bool areNamed = !arguments.operands().empty();
    const auto feeds = areNamed ? Names::feeds(session.client(), arguments.operands())
                                : FeedsVerb::sorted(session.client().feeds());
    const OutlineStore store(session.clientName());
    const Outlines outlines = OutlineStore::arranged(
        arguments.has("flat") ? Outlines() : store.outlines(), outlinesOf(feeds));
    if (arguments.has("json") || arguments.has("jsonl")) {
        Listing listing{"feeds", {{"title"}, {"url"}, {"page"}, {"folder"}}, {}};
        addRows(outlines, {}, listing);
        ListingWriter::write(listing, arguments);
    } else {
        Output::write(
            OPML::write(outlines, "Subscriptions of " + session.clientName(), DateText::now()));
    }
    if (feeds.empty()) Messages::say("No feeds yet. To subscribe to one: orvane add URL");
    return feeds.empty() ? ExitStatus::NothingMatched : ExitStatus::Done;
}

}  // namespace Commands
