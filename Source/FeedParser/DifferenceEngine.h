#pragma once

#include "FeedParser/EngineMap.h"
#include "Foundation/Ref.h"
#include "Foundation/Uncopyable.h"

#include <cstdint>
#include <vector>

namespace SQLite {
class Database;
}

namespace Orvane {

class EntryCore;
class FeedCore;

/// Merges one freshly parsed feed into the feed that there is: finds out, entry by entry, what is
/// new, what has changed, and what has left the document and goes to the archive. Works on a feed
/// in memory too, which has no archive. Made on the stack for one merge.
///
/// An entry is known again by its identifier, and what is in it by the hash of its source: one that
/// has not changed is not even loaded.
class DifferenceEngine : Foundation::Uncopyable {
 public:
    /// `force` compares every entry, also one whose hash is the same.
    DifferenceEngine(Foundation::Ref<FeedCore> feed, bool force);
    ~DifferenceEngine();

    /// Merges, in one transaction. Whether an entry was changed, added or archived. A document
    /// without an entry archives none.
    ///
    /// Throws what saving throws, and what `FeedCore::updateFrom` throws. A stored feed's entries
    /// are then as they were, and so is how far it has been read, so that the same document can be
    /// merged again; only files of entries that were to be archived may stay.
    bool updateFrom(const Foundation::Ref<FeedCore>& newFeed);

    std::uint32_t getUpdatedCount() const { return mUpdated; }
    std::uint32_t getAddedCount() const { return mAdded; }
    std::uint32_t getArchivedCount() const { return mArchived; }

 private:
    bool merge(FeedCore& newFeed);
    bool mergeEntries();
    bool finish();
    void savePending();
    void archiveNonCurrentEntries();
    void pruneUnchangedEntries();
    void updateExistingEntries();
    bool updateExistingEntry(EntryCore* entry);
    void updateEntry(EntryCore& entry, EntryCore* newEntry);
    void insertNewEntries();
    void insertEntry(EntryCore* entry, EntryCore* newEntry);
    void deleteFiles();
    void giveUp();

    std::uint32_t mUpdated = 0;
    std::uint32_t mAdded = 0;
    std::uint32_t mArchived = 0;  ///< have left the document
    const Foundation::Ref<FeedCore> mFeed;
    SQLite::Database* const mDatabase;  ///< of the feed; null if it is in memory
    const bool mForce;
    /// Of archived entries that are in the document again.
    std::vector<Foundation::Ref<Foundation::String>> mFilesToDelete;
    EngineMap mMap;
    std::vector<Foundation::Ref<EntryCore>> mTouched;  ///< what a failure has to undo
};

}  // namespace Orvane
