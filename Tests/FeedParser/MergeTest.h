#pragma once

#include "FeedParser/DifferenceEngine.h"
#include "FeedParser/Documents.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/FeedTest.h"

#include <string>
#include <vector>

/// A test that merges one document after the other into a stored feed.
class MergeTest : public FeedTest {
 protected:
    static Orvane::FeedCore* document(const std::vector<Post>& posts) {
        return makeDocument(kAddress, posts);
    }
    /// Merges a document. "changed 1 2 3" are the counts of updated, added and archived entries;
    /// "same" stands for a result of false.
    std::string merge(const std::vector<Post>& posts, bool force = false) {
        return merge(document(posts), force);
    }
    std::string merge(Orvane::FeedCore* parsed, bool force = false) {
        const Foundation::AutoreleasePool inner;
        Orvane::DifferenceEngine engine(feed, force);
        const bool changed = engine.updateFrom(parsed);
        return OVFormat("%s %u %u %u", changed ? "changed" : "same", engine.getUpdatedCount(),
                        engine.getAddedCount(), engine.getArchivedCount());
    }

    static std::string hashOf(const std::string& bytes) {
        return text(data(bytes)->SHA1HashString());
    }
    static std::string identifierOf(const std::string& guid) { return hashOf(kIdentifier + guid); }
    /// The stored entry of a GUID; null if there is none.
    static Orvane::EntryCore* entry(const std::string& guid) {
        return Orvane::EntryCore::getEntryWithIdentifier(string(identifierOf(guid)));
    }
    /// Whether an entry is in the document or, as "archived", in the file, read and flagged.
    std::string stateOf(const std::string& guid) const {
        const Orvane::EntryCore* stored = entry(guid);
        if (!stored) return "none";
        return std::string(stored->mCurrent ? "current" : "archived") +
               (stored->mRead ? " read" : "") + (stored->mFlagged ? " flagged" : "") +
               (exists(fileOf(guid)) ? " file" : "");
    }
    std::string fileOf(const std::string& guid) const {
        return truth(std::string(kIdentifier) + "/" + identifierOf(guid) + ".xml");
    }
    std::string readFileOf(const std::string& guid) const {
        return directory.readFile("Orvane/Feeds/" + std::string(kIdentifier) + "/" +
                                  identifierOf(guid) + ".xml");
    }
    /// The titles of the stored entries by row ID.
    static std::string titles() {
        std::string result;
        for (SQLite::Cursor cursor(&db(), "select title from Entries order by rowID");
             cursor.hasRow(); cursor.nextRow()) {
            result += cursor.cStringColumn(0) + std::string(" ");
        }
        return result;
    }

    Orvane::FeedCore* const feed = storedFeed();
    Orvane::SubscriptionCore* const subscription = subscribe(storedClient("client"), feed);
};
