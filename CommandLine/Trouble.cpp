#include "Trouble.h"

#include "AgentProbe.h"
#include "Places.h"

#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <system_error>

namespace Commands {

namespace fs = std::filesystem;

namespace {

constexpr const char* kAgentCure =
    "see \"orvane doctor\", and the agent's log: journalctl --user -t orvane";

bool isAgents(const OVError& error) {
    const bool isOwn = error.domain() == OVErrorDomain &&
                       (error.code() == OVAgentLaunchError || error.code() == OVIPCError);
    return isOwn || error.domain() == OVMachErrorDomain;
}

bool isLogin(const OVError& error) {
    return error.domain() == OVURLErrorDomain &&
           (error.code() == OVURLErrorUserAuthenticationRequired ||
            error.code() == OVURLErrorUserCancelledAuthentication);
}

/// The nearest folder that there is on the way to a path.
fs::path nearest(fs::path path) {
    std::error_code error;
    while (!fs::exists(path, error) && path.has_relative_path()) {
        path = path.parent_path();
    }
    return path;
}

std::string unreachable() {
    if (AgentProbe::look() == AgentProbe::State::NoBus) {
        return "there is no message bus to reach the agent on: install dbus-daemon, or log in to a "
               "session that has a bus";
    }
    return std::string("the agent, orvane-agent, cannot be started: ") + kAgentCure;
}

std::string cureOf(const OVError& error) {
    if (isLogin(error)) return "give a user name: orvane set FEED login NAME";
    if (!error.recoverySuggestion().empty()) return error.recoverySuggestion();
    return {};
}

}  // namespace

ExitStatus Trouble::statusOf(const OVError& error) {
    if (isLogin(error)) return ExitStatus::NeedsLogin;
    return isAgents(error) ? ExitStatus::NoAgent : ExitStatus::Failed;
}

std::string Trouble::textOf(const OVError& error) {
    std::string text = error.description().empty() ? error.toString() : error.description();
    if (!error.failureReason().empty() && error.failureReason() != text) {
        text += ' ' + error.failureReason();
    }
    const std::string cure = cureOf(error);
    return cure.empty() ? text : text + ' ' + cure;
}

Failure Trouble::ofOpening(const std::optional<OVError>& error) {
    const fs::path database = Places::database();
    const fs::path folder = nearest(database.parent_path());
    std::error_code ignored;
    const bool isThere = fs::exists(database, ignored);
    if (isThere && access(database.c_str(), R_OK) != 0) {
        return {ExitStatus::NoDatabase, database.string() +
                                            " cannot be read: " + std::strerror(errno) +
                                            "; make it readable for you, with chmod u+rw"};
    }
    if (!fs::is_directory(folder, ignored)) {
        return {ExitStatus::NoDatabase, folder.string() +
                                            " is no folder; set XDG_DATA_HOME to one that you can "
                                            "write to"};
    }
    if (access(folder.c_str(), W_OK | X_OK) != 0) {
        return {ExitStatus::NoDatabase,
                "cannot write to " + folder.string() + ": " + std::strerror(errno) +
                    "; make it writable, or set XDG_DATA_HOME to a folder that is"};
    }
    const bool agentRuns = AgentProbe::look() == AgentProbe::State::Runs;
    if ((error && isAgents(*error)) || !agentRuns) {
        return {ExitStatus::NoAgent, unreachable()};
    }
    return {ExitStatus::NoDatabase,
            database.string() +
                " cannot be used: move it away, and the agent makes a new one out "
                "of the files in " +
                (Places::storage() / "Feeds").string()};
}

Failure Trouble::ofChange(const std::string& what, const std::optional<OVError>& error) {
    if (!error) return {ExitStatus::Failed, what};
    if (isAgents(*error)) return {ExitStatus::NoAgent, what + ": " + unreachable()};
    return {statusOf(*error), what + ": " + textOf(*error)};
}

}  // namespace Commands
