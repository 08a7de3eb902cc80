#include "Foundation/Clock.h"
#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/Logger.h"
#include "Foundation/NetException.h"
#include "Foundation/URL.h"
#include "Model/AgentLink.h"
#include "Model/DocumentParser.h"
#include "Model/EntryCore.h"
#include "Model/EntryUndo.h"
#include "Model/FeedCore.h"
#include "Model/FileReader.h"
#include "Model/ParseMark.h"
#include "SQLite/Transaction.h"
#include "Utilities/FileUtils.h"

// How a feed and its old entries come back from their files.

namespace Orvane {

using Foundation::AutoreleasePool;
using Foundation::Clock;
using Foundation::Data;
using Foundation::Date;
using Foundation::gLog;
using Foundation::gWarn;
using Foundation::NetError;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using SQLite::gDatabase;
using SQLite::gLogTruth;
using SQLite::Transaction;

namespace {

constexpr std::string_view kExtension = ".xml";

/// What the name of an entry's file says.
Ref<String> identifierOf(const Foundation::URL* file) {
    const Ref<String> name = file->getLastPathComponent();
    const std::string_view text = String::view(name);
    return String::string(std::string(text.substr(0, text.size() - kExtension.size())));
}

bool isEntryFile(const Foundation::URL* file) {
    const Ref<String> name = file->getLastPathComponent();
    return name.get() && name->hasSuffix(kExtension) && !file->hasDirectoryPath();
}

/// Null for what is no entry, and for what must not be parsed.
Returner<EntryCore> parseEntry(Foundation::URL* file, Data* data, Foundation::URL* feedURL) {
    const ParseMark mark(file);
    DocumentParser* parser = mark.isBlocked() ? nullptr : DocumentParser::current();
    return parser ? parser->parseEntry(data, feedURL) : nullptr;
}

/// Reads the files of old entries, one while the one before it is parsed.
void readEntryFiles(FeedCore& feed, const FileUtils::ArrayOfURLs& files) {
    Ref<Foundation::URL> lastURL;
    Ref<Data> lastData;
    for (Foundation::URL* file : files) {
        const AutoreleasePool pool;
        if (!isEntryFile(file)) continue;
        const auto reader = FileReader::open(file);
        feed.addEntryFromFile(lastURL, lastData);
        lastURL = file;
        lastData = reader->finish();
    }
    feed.addEntryFromFile(lastURL, lastData);
}

}  // namespace

void FeedCore::recoverOldEntries() {
    if (!mRecoverOldEntries) return;
    if (!isChangeable()) return askForOldEntries();
    // Without a parser none would come back, and none would be asked for again.
    if (!DocumentParser::current()) return;
    const Transaction transaction(true);
    if (Foundation::URL* directory = getURLOfEntryXMLDir(false)) {
        const double start = Clock::current().now();
        NetError error;
        const Ref<FileUtils::ArrayOfURLs> files = FileUtils::getDirectoryContents(directory, error);
        const auto count = static_cast<unsigned>(files.get() ? files->count() : 0);
        gLogTruth.log("Reading %u entry files for %@ from %@", count, this, directory);
        if (files.get()) readEntryFiles(*this, *files);
        gLogTruth.log("...reading entry files took %g sec", Clock::current().now() - start);
    }
    mRecoverOldEntries.setValue(false);
    gDatabase->saveRows();
}

void FeedCore::askForOldEntries() {
    try {
        AgentLink::current().recoverOldEntries(this);
        mRecoverOldEntries.unload();
    } catch (const Foundation::NetException& exception) {
        // What is in the file can be read without an agent.
        doWarnAboutException(&exception, "void Orvane::FeedCore::recoverOldEntries()");
    }
}

bool FeedCore::addEntryFromFile(Foundation::URL* url, Data* data) {
    if (!url) return false;
    try {
        if (data && recoverEntry(url, data)) return true;
    } catch (...) {
        Foundation::warnAboutCurrentException(
            "bool Orvane::FeedCore::addEntryFromFile(URL *, Data *)");
    }
    gWarn.log("Unable to recover archived entry from <%@>", url);
    return false;
}

bool FeedCore::recoverEntry(Foundation::URL* url, Data* data) {
    const Ref<EntryCore> parsed = parseEntry(url, data, mURL.getValue());
    if (!parsed.get()) return false;
    parsed->mCurrent.setValue(false);
    gLogSub.log("    Recovered archived entry '%@' from <%@>", parsed->mTitle.getValue(), url);
    const Ref<String> identifier = identifierOf(url);
    const Ref<EntryCore> known = EntryCore::getEntryWithIdentifier(identifier);
    const Ref<EntryCore> entry = known.get() ? known : parsed;
    try {
        if (!known.get()) {
            // Before it has a feed, whose unread entries would be counted for each.
            entry->setRead(true);
            if (!adoptRecovered(entry, identifier)) return false;
        } else {
            if (!known->getFeed()) known->setFeed(this);
            known->updateFrom(parsed, true);
        }
        takeRecovered(*entry, url);
    } catch (...) {
        // What could not be saved now must not come in the way of all that is saved later.
        EntryUndo::giveUp(entry);
        throw;
    }
    return true;
}

void FeedCore::takeRecovered(EntryCore& entry, Foundation::URL* file) {
    entry.setRead(true);
    const Ref<Date> created = FileUtils::getFileCreationDate(file);
    if (created.get()) {
        entry.mLocalDateCreated.setValue(created);
        entry.mLocalDateUpdated.setValue(created);
    }
    entry.saveChanges();
}

bool FeedCore::adoptRecovered(EntryCore* entry, String* identifier) {
    addToEntries(entry);
    String* own = entry->getIdentifier();
    if (IsEqual(own, identifier)) return true;
    // A file that was named otherwise can be of an entry that there is.
    const Ref<EntryCore> other = EntryCore::getEntryWithIdentifier(own);
    if (!other.get()) return true;
    removeFromEntries(entry);
    return false;
}

void FeedCore::recoverFromXMLData() {
    const AutoreleasePool pool;
    const Transaction transaction(true);
    const Ref<Foundation::URL> file = getURLOfXMLFile();
    const Ref<Date> saved = FileUtils::exists(file) ? FileUtils::getFileModDate(file) : nullptr;
    if (saved.get()) refreshFromFile(file);
    mRefreshLocalDate.setValue(saved);
    mRecoverOldEntries.setValue(true);
    // The file has it.
    mXMLData = nullptr;
}

void FeedCore::refreshFromFile(Foundation::URL* file) {
    const Ref<Data> data = FileReader::open(file)->finish();
    FeedRefresher* feeder = data.get() ? getFeeder() : nullptr;
    if (!feeder) return;
    const ParseMark mark(file);
    if (!mark.isBlocked()) return feeder->refreshFromData(data);
    gWarn.log("Not parsing <%@>: it has brought the process down", file);
    setLastError({NetError::kOrvane, OVInternalError});
}

}  // namespace Orvane
