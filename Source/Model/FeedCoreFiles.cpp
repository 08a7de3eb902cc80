#include "Foundation/AssertionFailure.h"
#include "Foundation/Data.h"
#include "Foundation/Logger.h"
#include "Foundation/NetError.h"
#include "Foundation/URL.h"
#include "Model/FeedCore.h"
#include "Model/MinistryOfTruth.h"
#include "Utilities/FileSystem.h"
#include "Utilities/FileUtils.h"

// What of a feed stands in files: its document, and the entries that have left that.

namespace Orvane {

using Compatibility::FileSystem;
using Foundation::Data;
using Foundation::DataReturner;
using Foundation::gWarn;
using Foundation::NetError;
using Foundation::Ref;
using Foundation::String;
using Foundation::StringReturner;
using Foundation::URLReturner;

namespace {

StringReturner fileNameOf(const String* identifier) {
    return String::stringWithFormat("%@.xml", identifier);
}

bool makeTruthDirectories() {
    const Ref<Foundation::URL> storage = FileSystem::getStorageURL();
    const Ref<Foundation::URL> truth = FileSystem::getStorageTruthURL();
    return FileUtils::createDirectory(storage) && FileUtils::createDirectory(truth);
}

bool write(Data* data, Foundation::URL* file) {
    NetError error;
    if (data->writeToResource(file, error)) return true;
    gWarn.log("Unable to write <%@>: %@", file, error);
    return false;
}

void remove(Foundation::URL* file) {
    NetError error;
    if (FileUtils::deleteFile(file, error) || !FileUtils::exists(file)) return;
    gWarn.log("Unable to delete <%@>: %@", file, error);
}

/// Identifiers can come from another machine.
bool isFileName(const String* identifier) {
    const std::string_view name = String::view(identifier);
    return !name.empty() && name.front() != '.' && name.find('/') == std::string_view::npos;
}

}  // namespace

URLReturner FeedCore::getURLOfXMLFile() const {
    if (!getTable()) return nullptr;
    const Ref<Foundation::URL> truth = FileSystem::getStorageTruthURL();
    const Ref<String> name = fileNameOf(getIdentifier());
    return truth->byAppending(name, false);
}

DataReturner FeedCore::getXMLData() const {
    const Ref<Foundation::URL> file = getURLOfXMLFile();
    if (FileUtils::exists(file)) return Data::dataFromResource(file);
    return DataReturner(mXMLData);
}

void FeedCore::setXMLData(Data* data) {
    OV_ASSERT_AS(isChangeable(), "this->isChangeable()");
    const Ref<Foundation::URL> file = getURLOfXMLFile();
    // What is restored must not write over the truth that it comes from.
    if (!file.get() || MinistryOfTruth::instance()->isRestoring()) {
        mXMLData = data;
        return;
    }
    mXMLData = nullptr;
    if (!data) return remove(file);
    if (!makeTruthDirectories() || !write(data, file)) return;
    FileUtils::markQuarantined(file, mURL.getValue(), mAlternateURL.getValue(), mTitle.getValue());
}

Foundation::URL* FeedCore::getURLOfEntryXMLDir(bool create) const {
    if (mEntryXMLDir.get()) return mEntryXMLDir.get();
    if (!getTable()) return nullptr;
    const Ref<Foundation::URL> truth = FileSystem::getStorageTruthURL();
    const Ref<Foundation::URL> directory = truth->byAppending(getIdentifier(), true);
    const bool isThere = create ? makeTruthDirectories() && FileUtils::createDirectory(directory)
                                : FileUtils::exists(directory);
    if (isThere) mEntryXMLDir = directory;
    return mEntryXMLDir.get();
}

URLReturner FeedCore::getURLOfEntryXMLFile(String* identifier) {
    Foundation::URL* url = isChangeable() ? getURLOfEntryXMLDir(true) : nullptr;
    OV_ASSERT_AS(url && this->isChangeable(), "url && this->isChangeable()");
    OV_ASSERT_MESSAGE(isFileName(identifier), "'%@' identifies no entry", identifier);
    const Ref<String> name = fileNameOf(identifier);
    return url->byAppending(name, false);
}

void FeedCore::saveEntryToFile(String* identifier, Data* data) {
    // A directory is not made for a file that cannot be in it.
    if (!data && getTable() && isChangeable() && !getURLOfEntryXMLDir(false)) return;
    const Ref<Foundation::URL> file = getURLOfEntryXMLFile(identifier);
    if (data) {
        SQLite::gLogTruth.log("Saving entry XML to %@", file);
        write(data, file);
    } else {
        SQLite::gLogTruth.log("Deleting entry XML file %@", file);
        remove(file);
    }
}

void FeedCore::deleteEntryFile(String* identifier) {
    if (getTable()) saveEntryToFile(identifier, nullptr);
}

}  // namespace Orvane
