#include "Model/TruthRemoval.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Clock.h"
#include "Foundation/Logger.h"
#include "Foundation/Ref.h"
#include "Foundation/RunOnceTimer.h"
#include "Foundation/URL.h"
#include "Model/FeedCore.h"
#include "SQLite/Database.h"
#include "Utilities/FileSystem.h"
#include "Utilities/FileUtils.h"

#include <string>
#include <string_view>

namespace Orvane {

using Compatibility::FileSystem;
using Foundation::AutoreleasePool;
using Foundation::gWarn;
using Foundation::NetError;
using Foundation::Ref;
using Foundation::String;
using Foundation::URL;

namespace {

constexpr std::string_view kMark = ".deleted.at.";

/// Whether a feed is stored and has saved entries: in the file, or still to be read from theirs.
bool hasArchivedEntries(const std::string& feedIdentifier) {
    return SQLite::gDatabase->execScalar(
               "select exists(select 1 from Feeds as f where f.identifier=%Q and "
               "(f.recoverOldEntries or exists(select 1 from Entries as e where e.feed=f.rowID and "
               "not e.current)))",
               feedIdentifier.c_str()) != 0;
}

/// Where the directory was, if it has to be there again; null otherwise.
Foundation::URLReturner placeToPutBack(const std::string& feedIdentifier) {
    const Ref<URL> truth = FileSystem::getStorageTruthURL();
    const Ref<String> name = String::string(feedIdentifier);
    const Ref<URL> directory = truth->byAppending(name, true);
    if (FileUtils::exists(directory) || !hasArchivedEntries(feedIdentifier)) return nullptr;
    return Foundation::URLReturner(directory);
}

void finishOne(URL* left) {
    const Ref<String> name = left->getLastPathComponent();
    const std::string_view text = String::view(name);
    const std::size_t end = text.find(kMark);
    if (end == std::string_view::npos || !left->hasDirectoryPath()) return;
    const Ref<URL> place = placeToPutBack(std::string(text.substr(0, end)));
    if (!place) return FileUtils::asyncDeleteDirectory(left);
    NetError error;
    if (FileUtils::move(left, place, error)) return;
    gWarn.log("Could not put the directory %@ back as %@: %@", left, place, error);
}

/// Deletes a directory whose feed is being deleted, once that is committed.
class LaterDeletion : public Foundation::RefCounted {
 public:
    explicit LaterDeletion(URL* renamed) : mRenamed(renamed) {}
    void begin() { finishOne(mRenamed.get()); }

 private:
    Ref<URL> mRenamed;
};

/// The files of a feed whose deletion may still fail, or be cut off, are let alone until then.
void deleteWhenCommitted(URL* renamed) {
    if (!SQLite::gDatabase || !SQLite::gDatabase->isInTransaction()) {
        return FileUtils::asyncDeleteDirectory(renamed);
    }
    const Ref<LaterDeletion> deletion = new LaterDeletion(renamed);
    Foundation::callAfterDelay(0.0, deletion.get(), &LaterDeletion::begin);
}

}  // namespace

void TruthRemoval::remove(const FeedCore* feed, URL* directory) {
    const Ref<String> extension =
        String::stringWithFormat("deleted.at.%f", Foundation::Clock::current().now());
    const Ref<URL> renamed = directory->byAppendingExtension(extension);
    NetError error;
    if (FileUtils::move(directory, renamed, error)) {
        deleteWhenCommitted(renamed);
    } else {
        gWarn.log("Could not take the directory %@ of %@ away: %@", directory, feed, error);
    }
}

void TruthRemoval::finish() {
    const AutoreleasePool pool;
    const Ref<URL> truth = FileSystem::getStorageTruthURL();
    NetError error;
    const Ref<FileUtils::ArrayOfURLs> items = FileUtils::getDirectoryContents(truth, error);
    if (!items) return;
    for (URL* item : *items) {
        finishOne(item);
    }
}

}  // namespace Orvane
