#pragma once

#include "Foundation/Date.h"
#include "Foundation/Ref.h"
#include "Foundation/Uncopyable.h"
#include "Model/ClientCore.h"
#include "Model/EntryCore.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/CursorOf.h"

#include <memory>

namespace Orvane {

/// Walks the entries of a client's subscriptions that have changed since a date, in no order, for a
/// client that catches up with what happened while it did not run. It stands on the first one from
/// the start; there is none left when `getEntry` is null.
///
/// Reads the database for as long as it lives (see `SQLite::Cursor`): use it to its end at once.
class UpdatedEntryIterator : Foundation::Uncopyable {
 public:
    using Date = Foundation::Date;

    /// `since` is the date up to which all is known; null if nothing is. Throws
    /// `SQLite::Exception`.
    UpdatedEntryIterator(ClientCore* client, Date* since);
    ~UpdatedEntryIterator();

    /// Goes to the next entry. What the getters gave before is kept by nobody then.
    UpdatedEntryIterator& operator++();

    ClientCore* getClient() const { return mClient; }
    /// The date of the latest change so far, or what it began with: what to begin with next time.
    Date* getMaxDate() const { return mMaxDate; }
    EntryCore* getEntry() const { return mEntry; }
    /// By which the client has the entry; null at the end.
    SubscriptionCore* getSubscription() const { return mSubscription; }

    // Of the current entry. More than one may be true.

    bool hasUpdatedContent() const { return mHasUpdatedContent; }
    bool hasUpdatedFlags() const { return mHasUpdatedFlags; }
    bool hasExpired() const { return mHasExpired; }
    /// Whether a change of the XML alone counts as one of the content.
    bool usesXML() const { return mUsesXML; }

 private:
    void _fetchEntry();
    void noteDate(Date* date);

    Foundation::Ref<ClientCore> mClient;
    Foundation::Ref<Date> mMaxDate;
    std::unique_ptr<SQLite::CursorOf<EntryCore>> mCursor;
    Foundation::Ref<EntryCore> mEntry;
    Foundation::Ref<SubscriptionCore> mSubscription;
    bool mHasUpdatedContent = false;
    bool mHasUpdatedFlags = false;
    bool mHasExpired = false;
    bool mUsesXML;
};

}  // namespace Orvane
