#include "Model/MinistryOfTruth.h"

#include "Foundation/Clock.h"
#include "Foundation/Dictionary.h"
#include "Foundation/Logger.h"
#include "Model/ClientsPlist.h"
#include "Model/FeedCore.h"
#include "Utilities/FileSystem.h"
#include "Utilities/FileUtils.h"

namespace Orvane {

using namespace Foundation;
using Compatibility::FileSystem;
using SQLite::gLogTruth;

MinistryOfTruth* MinistryOfTruth::instance() {
    static MinistryOfTruth sInstance;
    return &sInstance;
}

MinistryOfTruth::MinistryOfTruth() : mSaveTimer(this, &MinistryOfTruth::saveSubscriptions) {}

void MinistryOfTruth::saveSubscriptionsSoon() {
    if (mSaveTimer.isRunning()) return;
    gLogTruth.log("Will save client/subscription info plist in 5 sec...");
    mSaveTimer.start(kSaveDelaySeconds, false);
}

void MinistryOfTruth::saveSubscriptions() {
    gLogTruth.log("Saving client/subscription info plist");
    mSaveTimer.stop();
    const Ref<URL> url = getClientPListURL();
    const Ref<Dictionary> root = ClientsPlist::describeDatabase();
    ClientsPlist::write(root, url);
}

URLReturner MinistryOfTruth::getClientPListURL() {
    return FileSystem::getClientPListURL();
}

void MinistryOfTruth::deleteTruthDirectoryForFeed(FeedCore* feed, URL* directory) {
    if (!directory) return;
    const Ref<String> extension = String::stringWithFormat("deleted.at.%f", Clock::current().now());
    const Ref<URL> renamed = directory->byAppendingExtension(extension);
    NetError error;
    if (FileUtils::move(directory, renamed, error)) {
        FileUtils::asyncDeleteDirectory(renamed);
    } else {
        gWarn.log("Could not take the directory %@ of %@ away: %@", directory, feed, error);
    }
}

}  // namespace Orvane
