#include "Foundation/Bundle.h"
#include "Foundation/DistributedNotificationCenter.h"
#include "Foundation/Logger.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/NotificationNames.h"
#include "Model/AgentLink.h"
#include "Model/DownloaderFactory.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Utilities/FileSystem.h"
#include "Utilities/FileUtils.h"
#include "Utilities/SafeFileName.h"

#include <algorithm>
#include <string>

// The file of an enclosure: its download, and where it is.

namespace Orvane {

using Compatibility::FileSystem;
using Foundation::Data;
using Foundation::NetError;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;

namespace {

namespace Names = Foundation::NotificationNames;

std::string nameIn(const String* text, std::size_t maxBytes) {
    return SafeFileName::make(String::view(text), maxBytes);
}

/// The first name that is one: of the server's, the URL's and ours.
std::string nameOf(const String* suggestedName, const Foundation::URL* url, std::size_t maxBytes) {
    std::string name = nameIn(suggestedName, maxBytes);
    if (!name.empty()) return name;
    const Ref<String> last = url ? url->getLastPathComponent() : nullptr;
    name = nameIn(last.get(), maxBytes);
    return name.empty() ? Foundation::localizedText("kUntitledFileName") : name;
}

}  // namespace

bool EnclosureCore::download() {
    if (isChangeable()) return downloadActual();
    const bool isTaken = AgentLink::current().enclosureAction(this, AgentLink::kDownload);
    unload();
    return isTaken;
}

bool EnclosureCore::downloadActual() {
    FileUtils::createDirectory(FileSystem::getStorageEnclosuresURL());
    FileUtils::createDirectory(FileSystem::getStorageIncompleteEnclosuresURL());
    if (!mDownloader.get()) {
        const Foundation::AutoreleasePool pool;
        DownloaderFactory* factory = DownloaderFactory::current();
        if (factory) mDownloader = factory->makeDownloader(this);
    }
    if (!mDownloader.get()) return false;
    mDownloader->start();
    return true;
}

bool EnclosureCore::cancelDownload() {
    if (isChangeable()) return cancelDownloadActual();
    const bool isTaken = AgentLink::current().enclosureAction(this, AgentLink::kCancel);
    unload();
    return isTaken;
}

bool EnclosureCore::cancelDownloadActual() {
    if (mDownloadState == kDownloading) {
        mDownloadState.setValue(kFailed);
        setDownloadError(kCancelled);
    }
    if (mDownloader.get()) {
        mDownloader->interrupt();
        postDownloadEnded();
    }
    return true;
}

bool EnclosureCore::deleteDownload() {
    if (isChangeable()) return deleteDownloadActual();
    return AgentLink::current().enclosureAction(this, AgentLink::kDelete);
}

bool EnclosureCore::deleteDownloadActual() {
    cancelDownloadActual();
    NetError error;
    bool isRemoved = FileUtils::deleteDirectory(getIncompleteDownloadURL(), error) > 0;
    if (Foundation::URL* file = mDownloadedPath) {
        if (FileUtils::deleteFile(file)) {
            mDownloadState.setValue(kDeleted);
            isRemoved = true;
        }
        mDownloadedPath.setValue(nullptr);
    }
    return isRemoved;
}

bool EnclosureCore::checkDownload() {
    if (isChangeable()) return checkDownloadActual();
    return AgentLink::current().enclosureAction(this, AgentLink::kCheck);
}

bool EnclosureCore::checkDownloadActual() {
    if (wasDownloadDeleted()) {
        mDownloadState.setValue(kDeleted);
        mDownloadedPath.setValue(nullptr);
    }
    return true;
}

bool EnclosureCore::wasDownloadDeleted() const {
    Foundation::URL* file = mDownloadedPath;
    return file && !FileUtils::exists(file);
}

NetError EnclosureCore::getDownloadError() const {
    return {mDownloadErrorDomain.getValue(), mDownloadErrorCode.getValue()};
}

void EnclosureCore::setDownloadError(NetError error) {
    mDownloadErrorDomain.setValue(error.domain);
    mDownloadErrorCode.setValue(error.code);
}

void EnclosureCore::postDownloadStarted() {
    postDownload(Names::kEnclosureDownloadStarted);
}

void EnclosureCore::postDownloadProgress() {
    postDownload(Names::kEnclosureDownloadProgress);
}

void EnclosureCore::postDownloadEnded() {
    postDownload(Names::kEnclosureDownloadEnded);
    mDownloader = nullptr;
}

void EnclosureCore::postDownload(const Foundation::NotificationName& name) {
    const EntryCore* entry = getEntry();
    const long long bytes = mDownloader.get() ? mDownloader->getDownloadedBytes() : 0;
    const Ref<String> object =
        String::stringWithFormat("%lld,%lld,%llu", entry ? entry->mFeed.getRowID() : 0, getRowID(),
                                 static_cast<unsigned long long>(bytes));
    Foundation::NotificationCenter::getDistributed()->post(name, object.get(), nullptr);
}

double EnclosureCore::getDownloadProgress() const {
    if (mDownloadState == kFinished) return wasDownloadDeleted() ? 0.0 : 1.0;
    const long long length = mLength;
    Foundation::URL* file = getIncompleteDownloadFile();
    if (length <= 0 || !file || !FileUtils::exists(file)) return 0.0;
    long long bytes = mDownloadedBytes;
    if (mDownloader.get()) {
        bytes = mDownloader->getDownloadedBytes();
    } else if (bytes < 0) {
        bytes = FileUtils::getFileLength(file);
    }
    // A server may send more than it has said.
    return std::clamp(static_cast<double>(bytes) / static_cast<double>(length), 0.0, 1.0);
}

void EnclosureCore::setDownloadedBytes(long long bytes) {
    gLogDownload.log("Notified of %lld downloaded bytes for %@", bytes, this);
    mDownloadedBytes = bytes;
}

Foundation::URL* EnclosureCore::getIncompleteDownloadURL() const {
    const Foundation::URL* url = mURL;
    if (!mIncompleteURL.get() && url) {
        const Ref<Data> text = url->getData();
        const Ref<String> hash = text->SHA1HashString();
        const Ref<String> name = String::stringWithFormat("%@.ovdownload", hash);
        const Ref<Foundation::URL> directory = FileSystem::getStorageIncompleteEnclosuresURL();
        mIncompleteURL = directory->byAppending(name.get(), true);
    }
    return mIncompleteURL;
}

Foundation::URL* EnclosureCore::getIncompleteDownloadFile() const {
    const Foundation::URL* directory = getIncompleteDownloadURL();
    if (!mIncompleteFile.get() && directory) {
        const Ref<String> name = String::string("Data");
        mIncompleteFile = directory->byAppending(name.get(), false);
    }
    return mIncompleteFile;
}

Foundation::URLReturner EnclosureCore::calculateUniqueDownloadFile(String* suggestedName) const {
    const Ref<Foundation::URL> directory = FileSystem::getStorageEnclosuresURL();
    for (std::size_t maxBytes = SafeFileName::kMaxBytes;;) {
        const Ref<String> name = String::string(nameOf(suggestedName, mURL, maxBytes));
        gLogDownload.log("calculateUniqueDownloadFile(): downloadFilename is %@", name);
        const Ref<Foundation::URL> file = directory->byAppending(name.get(), false);
        gLogDownload.log("calculateUniqueDownloadFile(): possiblyNonUniquePath %@", file);
        Ref<Foundation::URL> unique = FileUtils::pathWithUniqueFilenameForPath(file.get());
        const Ref<String> last = unique->getLastPathComponent();
        // A number that makes a long name unique must not make it too long.
        const std::size_t length = last->view().size();
        if (length <= SafeFileName::kMaxBytes) return unique;
        maxBytes -= length - SafeFileName::kMaxBytes;
    }
}

}  // namespace Orvane
