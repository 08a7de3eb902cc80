#include "SetVerb.h"

#include "CommonOptions.h"
#include "Failure.h"
#include "ListingWriter.h"
#include "Names.h"
#include "Session.h"
#include "SettingKeys.h"

#include <termios.h>
#include <unistd.h>

#include <iostream>

namespace Commands {

namespace {

using Words = std::vector<std::string>;

/// A line of standard input, which a terminal does not show.
std::string secret() {
    termios before{};
    const bool isTerminal = tcgetattr(STDIN_FILENO, &before) == 0;
    if (isTerminal) {
        termios quiet = before;
        quiet.c_lflag &= ~static_cast<tcflag_t>(ECHO);
        tcsetattr(STDIN_FILENO, TCSAFLUSH, &quiet);
        std::cerr << "Password: " << std::flush;
    }
    std::string line;
    std::getline(std::cin, line);
    if (isTerminal) {
        tcsetattr(STDIN_FILENO, TCSAFLUSH, &before);
        std::cerr << '\n';
    }
    return line;
}

/// Whether a key is no setting of the subscription but the feed's own.
bool isLogin(const std::string& key) {
    return key == "login" || key == "password";
}

void setLogin(OVFeed& feed, const std::string& key, const std::string& value) {
    if (key == "login") {
        feed.setLogin(value == "none" ? OVFeed::Text() : OVFeed::Text(value));
        return;
    }
    if (value != "-") {
        throw Failure(ExitStatus::Usage,
                      "a password is not written on the command line, where others can see it: "
                      "write \"password -\", and it is read from standard input");
    }
    feed.setPassword(secret());
}

Listing listOf(const std::vector<SettingKeys::Setting>& settings) {
    Listing listing{"settings", {{"key", "SETTING"}, {"value", "VALUE"}, {"from", "FROM"}}, {}};
    for (const SettingKeys::Setting& each : settings) {
        listing.rows.push_back(
            {{each.key, each.value, std::string(SettingKeys::nameOf(each.origin))}});
    }
    return listing;
}

void checkPairs(const Words& words) {
    if (words.size() % 2 != 0) {
        throw Failure(ExitStatus::Usage, "VALUE is missing behind \"" + words.back() + '"');
    }
}

Listing setDefaults(OVClient& client, const Words& words) {
    checkPairs(words);
    OVFeedSettings settings = client.settings();
    for (std::size_t i = 0; i < words.size(); i += 2) {
        SettingKeys::set(settings, words[i], words[i + 1]);
    }
    if (!words.empty()) client.setSettings(settings);
    return listOf(SettingKeys::ofClient(client.settings()));
}

Listing setFeed(OVClient& client, OVFeed& feed, const Words& words) {
    checkPairs(words);
    OVFeedSettings settings = feed.settings().value_or(OVFeedSettings());
    const OVFeedSettings before = settings;
    for (std::size_t i = 0; i < words.size(); i += 2) {
        if (!isLogin(words[i])) SettingKeys::set(settings, words[i], words[i + 1]);
    }
    // Not before all the rest is known to be right.
    for (std::size_t i = 0; i < words.size(); i += 2) {
        if (isLogin(words[i])) setLogin(feed, words[i], words[i + 1]);
    }
    if (settings != before) feed.setSettings(settings);
    Listing listing =
        listOf(SettingKeys::ofFeed(feed.settings().value_or(OVFeedSettings()), client.settings()));
    listing.rows.push_back({{std::string("login"), feed.login().value_or("none"),
                             std::string(SettingKeys::nameOf(SettingKeys::Origin::Feed))}});
    return listing;
}

}  // namespace

const VerbSpec& SetVerb::getSpec() const {
    static const VerbSpec sSpec{
        .name = "set",
        .summary = "show and change the settings of a feed, or of all",
        .operands = "FEED|--default [KEY VALUE...]",
        .most = VerbSpec::kAny,
        .kind = WordKind::Feed,
        .options = CommonOptions::join(
            {{{"default", 'd', "", "What goes for all feeds that have nothing of their own"}},
             CommonOptions::output(),
             CommonOptions::client()}),
        .details =
            "Shows the settings with where each comes from: the feed, the client, or built in.\n\n"
            "refresh: the time between two refreshes, such as 30min, 12h or never. expire: how "
            "long "
            "entries are kept, such as 14d or never. background: whether the feed is refreshed "
            "while the application does not run. enclosures: whether they are downloaded by "
            "themselves. max-enclosure: the largest that is, such as 50MB. types: the media types "
            "that are, with commas in between, or all. A value \"default\" gives a setting "
            "back.\n\n"
            "A feed has a login, too: a user name, or none; and a password, which is read from "
            "standard input and goes to the keyring.",
        .examples = {"set --default refresh 1h", "set \"Planet\" refresh 15min expire 90d",
                     "set \"Planet\" login ann password -"},
    };
    return sSpec;
}

ExitStatus SetVerb::run(const Arguments& arguments) {
    Words words = arguments.operands();
    const bool isDefault = arguments.has("default");
    if (!isDefault && words.empty()) throw Failure(ExitStatus::Usage, "FEED is missing");
    const Session session(arguments);
    if (isDefault) {
        ListingWriter::write(setDefaults(session.client(), words), arguments);
        return ExitStatus::Done;
    }
    const std::shared_ptr<OVFeed> feed = Names::feed(session.client(), words[0]);
    words.erase(words.begin());
    ListingWriter::write(setFeed(session.client(), *feed, words), arguments);
    return ExitStatus::Done;
}

}  // namespace Commands
