#pragma once

#include "Listing.h"

#include <Orvane/OVClient.h>

#include <vector>

namespace Commands {

/// Writes down what a client is told, for whoever takes it. Nothing is read from the database while
/// output waits.
class EventRecorder : public OVClientDelegate {
 public:
    /// Becomes the client's delegate, as long as this lives. With feeds, only of these.
    EventRecorder(OVClient& client, std::vector<std::shared_ptr<OVFeed>> feeds);
    ~EventRecorder() override;

    bool hasEvents() const { return !mEvents.rows.empty(); }
    /// What has happened since the last time.
    Listing take();

    void feedDidBeginRefresh(const std::shared_ptr<OVFeed>& feed) override;
    void feedDidEndRefresh(const std::shared_ptr<OVFeed>& feed) override;
    void feedDidAddEntries(const std::shared_ptr<OVFeed>& feed,
                           const OVEntry::List& entries) override;
    void feedDidRemoveEntriesWithIdentifiers(const std::shared_ptr<OVFeed>& feed,
                                             const std::vector<std::string>& ids) override;
    void feedDidUpdateEntries(const std::shared_ptr<OVFeed>& feed,
                              const OVEntry::List& entries) override;
    void feedDidChangeFlagsInEntries(const std::shared_ptr<OVFeed>& feed,
                                     const OVEntry::List& entries) override;
    void feedUnreadCountChanged(const std::shared_ptr<OVFeed>& feed) override;

 private:
    void add(const char* event, const OVFeed& feed, const OVEntry* entry, Value id = {});
    void addAll(const char* event, const OVFeed& feed, const OVEntry::List& entries);

    OVClient& mClient;
    std::vector<std::shared_ptr<OVFeed>> mFeeds;
    Listing mEvents;
};

}  // namespace Commands
