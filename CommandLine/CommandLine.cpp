#include "CommandLine.h"

#include "AddVerb.h"
#include "CompletionVerb.h"
#include "DoctorVerb.h"
#include "EntriesVerb.h"
#include "ExportVerb.h"
#include "Failure.h"
#include "FeedsVerb.h"
#include "HelpText.h"
#include "HelpVerb.h"
#include "ImportVerb.h"
#include "InspectVerb.h"
#include "Messages.h"
#include "Output.h"
#include "Pager.h"
#include "RefreshVerb.h"
#include "RemoveVerb.h"
#include "SetVerb.h"
#include "ShowVerb.h"
#include "StateVerb.h"
#include "StatusVerb.h"
#include "Trouble.h"
#include "VerbNames.h"
#include "VersionVerb.h"
#include "WatchVerb.h"

#include <Orvane/OVException.h>

#include <exception>

namespace Commands {

namespace {

/// Says what ended a verb, or kept it from beginning.
ExitStatus report(const std::string& verb) {
    try {
        throw;
    } catch (const Failure& failure) {
        Messages::complain(verb, failure.what());
        if (failure.getStatus() == ExitStatus::Usage) {
            Messages::say("See \"orvane " + (verb.empty() ? "" : verb + ' ') + "--help\".");
        }
        return failure.getStatus();
    } catch (const OVException& failure) {
        if (failure.error()) {
            const Failure named = Trouble::ofChange(failure.what(), *failure.error());
            Messages::complain(verb, named.what());
            return named.getStatus();
        }
        Messages::complain(verb, failure.what());
    } catch (const std::exception& failure) {
        Messages::complain(verb, failure.what());
    }
    return ExitStatus::Failed;
}

}  // namespace

CommandLine::CommandLine() {
    add<AddVerb>();
    add<RemoveVerb>();
    add<SetVerb>();
    add<ImportVerb>();
    add<ExportVerb>();
    add<FeedsVerb>();
    add<EntriesVerb>();
    add<ShowVerb>();
    add<StateVerb>(StateVerb::Kind::Mark);
    add<StateVerb>(StateVerb::Kind::Flag);
    add<StateVerb>(StateVerb::Kind::Unflag);
    add<RefreshVerb>();
    add<WatchVerb>();
    add<StatusVerb>();
    add<DoctorVerb>();
    add<InspectVerb>();
    add<CompletionVerb>([this] { return specs(); });
    add<VersionVerb>();
    add<HelpVerb>([this] { return specs(); });
}

ExitStatus CommandLine::run(const std::vector<std::string>& words) {
    try {
        if (words.empty()) throw Failure(ExitStatus::Usage, "VERB is missing");
        if (words[0].starts_with('-')) return runProgram(words[0]);
        return runVerb(verbOf(words[0]), {words.begin() + 1, words.end()});
    } catch (const std::exception&) {
        return report({});
    }
}

ExitStatus CommandLine::runProgram(const std::string& option) const {
    if (option == "-h") {
        Output::write(HelpText::program(specs()));
    } else if (option == "--help") {
        Pager::show(HelpText::programManual(specs()));
    } else if (option == "--version") {
        return runVerb(verbOf("version"), {});
    } else {
        throw Failure(ExitStatus::Usage, "there is no option " + option);
    }
    return ExitStatus::Done;
}

ExitStatus CommandLine::runVerb(Verb& verb, const std::vector<std::string>& words) const {
    const VerbSpec& spec = verb.getSpec();
    try {
        const Arguments arguments(spec, words);
        if (arguments.wantsShortHelp()) {
            Output::write(HelpText::verb(spec));
            return ExitStatus::Done;
        }
        if (arguments.wantsManual()) {
            Pager::show(HelpText::verbManual(spec));
            return ExitStatus::Done;
        }
        return verb.run(arguments);
    } catch (const std::exception&) {
        return report(spec.name);
    }
}

std::vector<const VerbSpec*> CommandLine::specs() const {
    std::vector<const VerbSpec*> all;
    for (const auto& verb : mVerbs) {
        all.push_back(&verb->getSpec());
    }
    return all;
}

Verb& CommandLine::verbOf(const std::string& name) const {
    const VerbSpec& spec = VerbNames::find(name, specs());
    for (const auto& verb : mVerbs) {
        if (&verb->getSpec() == &spec) return *verb;
    }
    throw Failure(ExitStatus::Usage, "there is no verb \"" + name + '"');
}

}  // namespace Commands
