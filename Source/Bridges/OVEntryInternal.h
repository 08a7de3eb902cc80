#pragma once

#include "Bridges/OVInternal.h"
#include "Foundation/String.h"
#include "Model/EntryCore.h"

#include <Orvane/OVEntry.h>

#include <memory>
#include <string>

class OVClient;
class OVFeed;

/// The state of an `OVEntry`.
class OVEntryInternal : public OVInternal {
 public:
    /// Stands for a row from now on.
    void _initWithCore(Orvane::EntryCore* core, OVObject* object);

    /// The row, for use: see `OVInternal::useCore`.
    Orvane::EntryCore& core() const { return static_cast<Orvane::EntryCore&>(useCore()); }
    /// The same to look at; null only while the object is made.
    Orvane::EntryCore* peek() const { return static_cast<Orvane::EntryCore*>(getCore()); }

    /// The feed by which it was found. Throws `AssertionFailure` for null, and if that is another
    /// one that still has the entry. What stands for the same feed of two clients is not another
    /// one.
    void _setFeed(const std::shared_ptr<OVFeed>& newFeed);
    void _setClient(const std::shared_ptr<OVClient>& newClient) { client = newClient; }
    /// See `OVEntry::feed`.
    std::shared_ptr<OVFeed> findFeed();
    /// The client through which it was found, or else that of the feed; null if neither is known.
    std::shared_ptr<OVClient> findClient() const;

    std::shared_ptr<OVFeed> feed;      ///< null until it is known
    std::shared_ptr<OVClient> client;  ///< through which it was found; may be null
    std::string titleForDisplay;       ///< empty until it is made
    double titleDate = 0;              ///< of the data that it was made of

 protected:
    Rank getRank() const override { return Rank::Entry; }
    Foundation::Ref<Orvane::Core> findAgain() override;
    void foundAgain() override;

 private:
    bool hasMoved(const OVFeed& from) const;
    void noteIdentifier();

    /// By which the entry is found again, when what was read of the row has been let go of.
    Foundation::Ref<Foundation::String> mIdentifier;
};
