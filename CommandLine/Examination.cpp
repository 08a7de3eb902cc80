#include "Examination.h"

#include "AgentProbe.h"
#include "DateText.h"
#include "MessageBus.h"
#include "Names.h"
#include "Places.h"
#include "Trouble.h"

#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <system_error>

namespace Commands {

namespace fs = std::filesystem;

namespace {

using Kind = Listing::Column::Kind;

constexpr double kDay = 24 * 3600.0;
constexpr const char* kUnit = "orvane-agent.service";
constexpr const char* kSecrets = "org.freedesktop.secrets";

/// Where the user manager reads units (systemd.unit(5), as far as packages and users put any
/// there).
std::vector<fs::path> unitFolders() {
    const char* home = std::getenv("HOME");
    std::vector<fs::path> all{"/etc/systemd/user", "/usr/local/lib/systemd/user",
                              "/usr/lib/systemd/user", "/lib/systemd/user"};
    if (home) {
        all.push_back(fs::path(home) / ".config/systemd/user");
        all.push_back(fs::path(home) / ".local/share/systemd/user");
    }
    return all;
}

bool hasUserManager() {
    const char* runtime = std::getenv("XDG_RUNTIME_DIR");
    std::error_code error;
    return runtime && fs::exists(fs::path(runtime) / "systemd", error);
}

std::string cureOf(const OVFeed& feed, const OVError& error) {
    const std::string id = feed.identifier().value_or("").substr(0, 12);
    if (Trouble::statusOf(error) == ExitStatus::NeedsLogin) {
        return "orvane set " + id + " login NAME password -";
    }
    if (error.domain() == OVURLErrorDomain && error.code() == OVURLErrorFileDoesNotExist) {
        return "it is gone: orvane rm " + id;
    }
    return "orvane refresh --force " + id + ", or orvane rm " + id;
}

}  // namespace

Examination::Examination()
    : mFindings{"findings",
                {{"what", "WHAT"},
                 {"result", "RESULT"},
                 {"text", "FOUND", Kind::Flexible},
                 {"cure", "CURE", Kind::Flexible}},
                {}} {}

void Examination::storage() {
    const std::string folder = Places::storage().string();
    std::error_code error;
    if (!fs::exists(folder, error)) {
        return good("storage", folder + " is not there yet; it is made when it is needed");
    }
    if (access(folder.c_str(), W_OK | X_OK) != 0) {
        return problem("storage", "cannot write to " + folder,
                       "make it writable, or set XDG_DATA_HOME to a folder that is");
    }
    const fs::space_info space = fs::space(folder, error);
    if (!error && space.available < kLeastRoom) {
        return problem("storage", "the disk is nearly full",
                       "free some room; orvane set --default expire 30d keeps less");
    }
    good("storage", folder);
}

void Examination::bus() {
    const MessageBus found;
    if (!found.isThere()) {
        return problem("message bus", "there is none",
                       "install dbus-daemon, or log in to a session");
    }
    good("message bus", "it answers");
    if (found.hasOwner(AgentProbe::kName)) return good("agent", "running");
    if (found.canStart(AgentProbe::kName)) return good("agent", "not running, started when needed");
    problem("agent", "the message bus does not know how to start it",
            "install orvane-agent where XDG_DATA_DIRS leads to, or start it by hand");
}

void Examination::units() {
    if (!hasUserManager()) {
        return good("units", "no service manager: the message bus starts the agent");
    }
    for (const fs::path& folder : unitFolders()) {
        std::error_code error;
        if (fs::exists(folder / kUnit, error)) return good("units", (folder / kUnit).string());
    }
    warning("units", "the service manager has no orvane-agent.service",
            "install orvane-agent, or feeds are refreshed only while something uses them");
}

void Examination::keyring(bool isNeeded) {
    const MessageBus found;
    if (!found.hasOwner(kSecrets) && !found.canStart(kSecrets)) {
        if (!isNeeded) return good("keyring", "none, and none is needed");
        return warning("keyring", "there is none, and a feed has a login",
                       "install gnome-keyring, or set SECRET_BACKEND=file");
    }
    const auto isLocked = found.flag(kSecrets, "/org/freedesktop/secrets/aliases/default",
                                     "org.freedesktop.Secret.Collection", "Locked");
    if (isLocked.value_or(false)) {
        return warning("keyring", "it is locked: feeds with a login cannot be fetched",
                       "log in to the desktop, or unlock it");
    }
    good("keyring", "it is there");
}

void Examination::clock(const std::optional<OVDate>& newest, const OVDate& now) {
    if (newest && *newest > now.addingSeconds(kDay)) {
        return problem("clock", "feeds were refreshed in the future: " + DateText::iso8601(*newest),
                       "set the clock: timedatectl set-ntp true");
    }
    good("clock", DateText::iso8601(now));
}

void Examination::database(long long feeds, long long entries) {
    good("database", std::to_string(feeds) + " feeds, " + std::to_string(entries) + " entries");
}

void Examination::feeds(const std::vector<std::shared_ptr<OVFeed>>& all, const OVDate& now) {
    for (const std::shared_ptr<OVFeed>& feed : all) {
        const std::string title = Names::titleOf(*feed);
        if (const std::optional<OVError> error = feed->lastError()) {
            problem(title, Trouble::textOf(*error), cureOf(*feed, *error));
            continue;
        }
        const auto newest = feed->localDateCreatedOfNewestEntry();
        if (newest && now.absoluteTime() - newest->absoluteTime() > kStaleSeconds) {
            warning(
                title, "nothing new since " + DateText::iso8601(*newest).substr(0, 10),
                "perhaps it has moved; orvane rm " + feed->identifier().value_or("").substr(0, 12));
        }
    }
}

void Examination::good(const std::string& what, const std::string& text) {
    add(what, "good", text, {}, Listing::Style::Plain);
}

void Examination::warning(const std::string& what, const std::string& text,
                          const std::string& cure) {
    add(what, "warning", text, cure, Listing::Style::Strong);
}

void Examination::problem(const std::string& what, const std::string& text,
                          const std::string& cure) {
    ++mProblems;
    add(what, "problem", text, cure, Listing::Style::Bad);
}

void Examination::add(const std::string& what, const char* result, const std::string& text,
                      const std::string& cure, Listing::Style style) {
    mFindings.rows.push_back({{what, std::string(result), text, cure}, style});
}

}  // namespace Commands
