#include "DoctorVerb.h"

#include "CommonOptions.h"
#include "DateText.h"
#include "Examination.h"
#include "Failure.h"
#include "ListingWriter.h"
#include "Messages.h"
#include "Session.h"

namespace Commands {

namespace {

/// What the database has to say. Gives why it has nothing to say, if so.
ExitStatus examineDatabase(const Arguments& arguments, Examination& examination) {
    try {
        const Session session(arguments);
        const auto feeds = session.client().feeds();
        const OVDate now = DateText::now();
        examination.database(static_cast<long long>(feeds.size()),
                             static_cast<long long>(session.client().entryCount({})));
        std::optional<OVDate> newest;
        bool hasLogin = false;
        for (const std::shared_ptr<OVFeed>& feed : feeds) {
            const auto last = feed->lastRefreshDate();
            if (last && (!newest || *newest < *last)) newest = last;
            hasLogin = hasLogin || feed->login();
        }
        examination.keyring(hasLogin);
        examination.clock(newest, now);
        examination.feeds(feeds, now);
        return ExitStatus::Done;
    } catch (const Failure& failure) {
        examination.problem("database", "it cannot be used", failure.what());
        return failure.getStatus();
    }
}

}  // namespace

const VerbSpec& DoctorVerb::getSpec() const {
    static const VerbSpec sSpec{
        .name = "doctor",
        .summary = "find out what is wrong, and say what helps",
        .options = CommonOptions::join({CommonOptions::output(), CommonOptions::client()}),
        .details =
            "Looks at the storage, the message bus, the agent, the units of the service "
            "manager, the database, the keyring and the clock, and at feeds whose last refresh "
            "failed or that have had nothing new for a year. What is wrong comes with what can "
            "be done about it.\n\n"
            "The exit status is 5 if there is a problem, 7 or 8 if the agent or the database "
            "cannot be used at all.",
        .examples = {"doctor", "doctor --json | jq '.findings[] | select(.result==\"problem\")'"},
    };
    return sSpec;
}

ExitStatus DoctorVerb::run(const Arguments& arguments) {
    Examination examination;
    examination.storage();
    examination.bus();
    examination.units();
    const ExitStatus status = examineDatabase(arguments, examination);
    ListingWriter::write(examination.findings(), arguments);
    const std::size_t problems = examination.problemCount();
    Messages::say(problems == 0 ? "No problems."
                                : counted(problems, "problem", "problems") + " found.");
    if (status != ExitStatus::Done) return status;
    return problems == 0 ? ExitStatus::Done : ExitStatus::Failed;
}

}  // namespace Commands
