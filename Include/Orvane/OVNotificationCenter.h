#pragma once

#include <Orvane/OVBase.h>
#include <Orvane/OVEntry.h>
#include <Orvane/OVObject.h>

#include <functional>
#include <map>
#include <memory>
#include <string>
#include <variant>
#include <vector>

/// A feed began or ended to be refreshed: ask it which.
inline constexpr char OVFeedRefreshingNotification[] = "OVFeedRefreshing";
/// Entries of a feed have changed. The info has lists by the four keys.
inline constexpr char OVFeedEntriesChangedNotification[] = "OVFeedEntriesChanged";
/// How many entries of a feed are unread has changed. The object of these three is the feed.
inline constexpr char OVFeedUnreadCountChangedNotification[] = "OVFeedUnreadCountChanged";
/// The state of an enclosure's download has changed. The object is the enclosure.
inline constexpr char OVEnclosureDownloadStateDidChangeNotification[] =
    "OVEnclosureDownloadStateDidChange";

/// Entries that are new.
inline constexpr char OVFeedAddedEntriesKey[] = "AddedEntries";
/// The list of this key is one of identifiers: of entries that are gone, or have expired.
inline constexpr char OVFeedRemovedEntriesKey[] = "RemovedEntries";
/// Entries whose content has changed.
inline constexpr char OVFeedUpdatedEntriesKey[] = "UpdatedEntries";
/// Entries that were marked as read or flagged, or as neither.
inline constexpr char OVFeedDidChangeEntryFlagsKey[] = "OVFeedDidChangeEntryFlagsKey";

/// What is announced.
struct OVNotification {
    /// Entries, or identifiers of entries that are gone.
    using List = std::variant<OVEntry::List, std::vector<std::string>>;

    std::string name;                  ///< one of those above, or the application's own
    std::shared_ptr<OVObject> object;  ///< what it happened to; may be null
    std::map<std::string, List> info;  ///< more, by the keys above
};

/// Where changes are announced in the application. The thread of the library's objects.
class OVNotificationCenter {
 public:
    /// What is called with a notification.
    using Observer = std::function<void(const OVNotification&)>;
    /// An observer is called for as long as somebody holds this.
    using Observation = std::shared_ptr<void>;

    /// The application's centre.
    OV_EXPORT static OVNotificationCenter& defaultCenter();

    /// Calls the observer with every notification of this name from this object; an empty name and
    /// a null object stand for any. The object is not kept. What the observer throws is reported
    /// and goes no further.
    [[nodiscard]] OV_EXPORT Observation addObserver(const std::string& name, const OVObject* object,
                                                    Observer observer);
    /// Calls the observers, in the order in which they came.
    OV_EXPORT void post(const OVNotification& notification);

 private:
    struct Entry;
    OVNotificationCenter() = default;

    std::vector<std::weak_ptr<Entry>> mEntries;
};
