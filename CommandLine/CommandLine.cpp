#include "CommandLine.h"

#include "InspectVerb.h"

#include <CLI/CLI.hpp>

#include <cstdio>
#include <exception>
#include <string>

namespace Commands {

namespace {

constexpr const char* kExitCodes =
    "Exit status: 0 done, 1 nothing matched, 2 wrong usage, 3 unknown or ambiguous name,\n"
    "4 partly failed, 5 failed, 6 needs a login, 7 agent not reachable, 8 database not usable.";

/// The program's name with that of the verb which was begun, if one was.
std::string nameOf(const CLI::App& app) {
    std::string name = app.get_name();
    for (const CLI::App* verb : app.get_subcommands()) {
        name += ' ' + verb->get_name();
    }
    return name;
}

void say(const std::string& line) {
    std::fputs((line + '\n').c_str(), stderr);
}

/// Shows the help that was asked for, or says what is wrong.
ExitStatus handle(const CLI::App& app, const CLI::ParseError& error) {
    if (error.get_exit_code() == static_cast<int>(CLI::ExitCodes::Success)) {
        return app.exit(error) == 0 ? ExitStatus::Done : ExitStatus::Usage;
    }
    const std::string name = nameOf(app);
    say(name + ": " + error.what());
    say("See \"" + name + " --help\".");
    return ExitStatus::Usage;
}

ExitStatus runGuarded(const CLI::App& app, Verb& verb) {
    try {
        return verb.run();
    } catch (const std::exception& failure) {
        say(nameOf(app) + ": " + failure.what());
        return ExitStatus::Failed;
    }
}

}  // namespace

CommandLine::CommandLine() {
    mVerbs.push_back(std::make_unique<InspectVerb>());
}

ExitStatus CommandLine::run(int count, const char* const* arguments) {
    CLI::App app("Feeds, from the command line.", "orvane");
    app.set_help_flag("-h,--help", "Show this help");
    app.require_subcommand(1);
    app.footer(kExitCodes);
    for (const auto& verb : mVerbs) {
        verb->addOptions(*app.add_subcommand(verb->getName(), verb->getSummary()));
    }
    try {
        app.parse(count, arguments);
    } catch (const CLI::ParseError& error) {
        return handle(app, error);
    }
    for (const auto& verb : mVerbs) {
        if (app.got_subcommand(verb->getName())) return runGuarded(app, *verb);
    }
    return ExitStatus::Usage;  // not reached: one of them is required
}

}  // namespace Commands
