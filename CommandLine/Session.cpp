#include "Session.h"

#include "Messages.h"
#include "SettingKeys.h"
#include "Trouble.h"

#include <algorithm>
#include <optional>

namespace Commands {

Session::Session(const Arguments& arguments) : mName(arguments.value("client").value_or(kClient)) {
    if (mName.empty()) throw Failure(ExitStatus::Usage, "--client needs an identifier");
    open();
}

void Session::open() {
    OVClient::setApplicationIdentifier(kClient);
    const std::vector<std::string> known = OVClient::allClientBundleIdentifiers();
    const bool isKnown = std::find(known.begin(), known.end(), mName) != known.end();
    std::optional<OVError> error;
    mClient = OVClient::clientForBundleIdentifier(mName, &error);
    if (!mClient && !error) {
        throw Failure(ExitStatus::UnknownName,
                      mName + " belongs to another application, which keeps it to itself");
    }
    if (!mClient) throw Trouble::ofOpening(error);
    if (!isKnown) setUp();
}

void Session::setUp() const {
    OVFeedSettings settings = mClient->settings();
    settings.setExpirationInterval(SettingKeys::kForGood);
    settings.setMaxEnclosureSize(kMaxEnclosureSize);
    mClient->setSettings(settings);
    Messages::say("New client " + mName +
                  ": entries are kept for good, enclosures up to 500 MB. To change that:\n"
                  "  orvane set --default expire 30d\n"
                  "  orvane set --default max-enclosure 50MB");
}

}  // namespace Commands
