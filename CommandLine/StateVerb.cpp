#include "StateVerb.h"

#include "CommonOptions.h"
#include "EntrySelection.h"
#include "Failure.h"
#include "ListingWriter.h"
#include "Messages.h"
#include "Names.h"
#include "Session.h"

#include <algorithm>

namespace Commands {

namespace {

/// Entries that the agent is told of in one call.
constexpr std::size_t kCallSize = 10000;

VerbSpec specOf(const char* name, const char* summary, const char* operands,
                std::vector<std::string> examples) {
    VerbSpec spec{
        .name = name,
        .summary = summary,
        .operands = operands,
        .most = VerbSpec::kAny,
        .kind = WordKind::Entry,
        .options = CommonOptions::join({EntrySelection::options(),
                                        {{"all", 'a', "", "All entries of the client"}},
                                        CommonOptions::output(),
                                        CommonOptions::client()}),
        .details =
            "Entries are named, or chosen by the same options as those of \"orvane entries\". "
            "Said is how many have changed. The exit status is 1 if nothing was chosen.",
        .examples = std::move(examples),
    };
    return spec;
}

VerbSpec markSpec() {
    VerbSpec spec = specOf("mark", "mark entries as read or unread", "read|unread [ENTRY...]",
                           {"mark read --feed \"Planet\" --until 7d", "mark unread 3f9a21c"});
    spec.fewest = 1;
    spec.choices = {"read", "unread"};
    return spec;
}

/// Whether an entry is already what it is to become.
bool isThere(const OVEntry& entry, std::optional<bool> read, std::optional<bool> flagged) {
    return (!read || entry.isRead() == *read) && (!flagged || entry.isFlagged() == *flagged);
}

OVEntry::List chosen(const Arguments& arguments, const std::vector<std::string>& names,
                     const OVClient& client) {
    const bool isSelected = EntrySelection::isGiven(arguments) || arguments.has("all");
    if (!names.empty() && isSelected) {
        throw Failure(ExitStatus::Usage, "name entries or choose them by options, not both");
    }
    if (!names.empty()) return Names::entries(client, names);
    if (!isSelected) {
        throw Failure(ExitStatus::Usage, "ENTRY is missing; to choose all there are, write --all");
    }
    return client.entries(EntrySelection::query(arguments, client));
}

}  // namespace

const VerbSpec& StateVerb::getSpec() const {
    static const VerbSpec sMark = markSpec();
    static const VerbSpec sFlag =
        specOf("flag", "flag entries, so that they stand out", "[ENTRY...]", {"flag 3f9a21c"});
    static const VerbSpec sUnflag = specOf("unflag", "take the flags of entries away", "[ENTRY...]",
                                           {"unflag --flagged --until 30d"});
    switch (mKind) {
        case Kind::Flag:
            return sFlag;
        case Kind::Unflag:
            return sUnflag;
        case Kind::Mark:
            break;
    }
    return sMark;
}

StateVerb::Target StateVerb::targetOf(const Arguments& arguments) const {
    if (mKind == Kind::Flag) return {{}, true, "flagged"};
    if (mKind == Kind::Unflag) return {{}, false, "unflagged"};
    const std::string& word = arguments.operands()[0];
    if (word != "read" && word != "unread") {
        throw Failure(ExitStatus::Usage,
                      "the first word is \"read\" or \"unread\", not \"" + word + '"');
    }
    return {word == "read", {}, "marked as " + word};
}

ExitStatus StateVerb::run(const Arguments& arguments) {
    const Target target = targetOf(arguments);
    std::vector<std::string> names = arguments.operands();
    if (mKind == Kind::Mark) names.erase(names.begin());
    const Session session(arguments);
    OVEntry::List entries = chosen(arguments, names, session.client());
    const bool wereAny = !entries.empty();
    std::erase_if(entries,
                  [&](const auto& entry) { return isThere(*entry, target.read, target.flagged); });
    for (std::size_t i = 0; i < entries.size(); i += kCallSize) {
        const auto first = entries.begin() + static_cast<std::ptrdiff_t>(i);
        const auto size = std::min(kCallSize, entries.size() - i);
        OVEntry::setFlags({first, first + static_cast<std::ptrdiff_t>(size)}, target.read,
                          target.flagged);
    }
    const auto changed = static_cast<long long>(entries.size());
    if (arguments.has("json") || arguments.has("jsonl")) {
        ListingWriter::writeObject({"change", {{"changed"}}, {{{changed}}}}, arguments);
    }
    Messages::say(counted(entries.size(), "entry", "entries") + ' ' + target.word + '.');
    return wereAny ? ExitStatus::Done : ExitStatus::NothingMatched;
}

}  // namespace Commands
