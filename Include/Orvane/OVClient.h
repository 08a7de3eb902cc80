#pragma once

#include <Orvane/OVClientDelegate.h>
#include <Orvane/OVDate.h>
#include <Orvane/OVEnclosure.h>
#include <Orvane/OVEntry.h>
#include <Orvane/OVEntryQuery.h>
#include <Orvane/OVError.h>
#include <Orvane/OVFeed.h>
#include <Orvane/OVFeedSettings.h>
#include <Orvane/OVObject.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

class OVClientInternal;

/// An application as a subscriber of feeds: the entry to all else.
///
/// Reading goes to the database directly, changes go to the agent, which is started if need be: an
/// operation that changes something waits until that is saved, at most 30 seconds.
///
/// Getters of values throw `OVException` if the database cannot be read. Operations that give
/// objects or lists report failures in the log instead, and give null or an empty list. Thread: see
/// `OVObject`.
class OV_EXPORT OVClient : public OVObject {
 public:
    // Making one.

    /// Says who the application is. Before the first use of anything else; otherwise it is the ID
    /// of GIO's default application, or the desktop file by which it was started, or the program's
    /// name. Throws `OVException` if another identifier is in use already, and for an empty one.
    static void setApplicationIdentifier(const std::string& identifier);
    /// The application's own client, which is made in the database if need be, and lives as long as
    /// the process. Null, with the error unless `error` is null, if it cannot be had; without an
    /// error, but with a warning, if the application has no identifier.
    static std::shared_ptr<OVClient> applicationClient(std::optional<OVError>* error = nullptr);
    /// The client of an application, which is made if need be. Null, with the error if there is
    /// one, if it cannot be had, and for another application's private client. Throws
    /// `OVException` for an empty identifier.
    static std::shared_ptr<OVClient> clientForBundleIdentifier(
        const std::string& bundleIdentifier, std::optional<OVError>* error = nullptr);
    /// The identifiers of all clients, but for the private ones of other applications, in no order.
    /// An empty list if they cannot be read.
    static std::vector<std::string> allClientBundleIdentifiers();
    /// Has the agent exchange read and flagged states with the user's other machines now. Whether
    /// it does; false if it cannot be asked.
    static bool startSync();
    /// Turns the library's log on or off, whatever the preferences say.
    static void _enableOVLogging(bool enabled);

    /// Nothing is told any more. The feeds of the client go on.
    ~OVClient() override;

    /// The application's identifier.
    std::string signature() const;
    /// Whether other applications must not use this client.
    bool isPrivate() const;
    /// Keeps the client from other applications, or lets them have it. Throws `OVException` if the
    /// agent cannot do it.
    void setPrivate(bool value);
    /// What goes for all feeds whose own settings leave it open. Throws `OVException` on failure.
    OVFeedSettings settings() const;
    /// Sets that; none sets `OVFeedSettings::defaultClientSettings()`. Throws `OVException` if the
    /// agent cannot do it.
    void setSettings(const std::optional<OVFeedSettings>& settings);

    // Being told.

    /// Who is told; null for nobody.
    OVClientDelegate* delegate() const;
    /// Null takes it away. Not owned: must outlive the client, or be taken away before.
    void setDelegate(OVClientDelegate* delegate);
    /// Up to when changes of entries have been told; none for a client that was told all.
    std::optional<OVDate> dateLastUpdated() const;
    /// Whether changes of entries are told as they come: true at first.
    bool tracksEntryChanges() const;
    /// What happens while it is false is told with the next change after it is true again.
    void setTracksEntryChanges(bool tracks);
    /// Tells the delegate and the observers now of all changes of entries since a date, of all
    /// entries for none, and moves `dateLastUpdated` to the last of them. A failure is reported in
    /// the log: what has been found by then is told.
    void sendChangesSinceDate(const std::optional<OVDate>& date);

    // Feeds.

    /// All feeds to which the client has subscribed, in no order.
    std::vector<std::shared_ptr<OVFeed>> feeds() const;
    /// Subscribes to a feed in memory, with the settings that it was given; the object stands for
    /// the subscription then. False if another object stands for the client's feed of that URL, and
    /// if the agent cannot do it. Throws `OVException` for null and for a feed that has a client.
    bool addFeed(const std::shared_ptr<OVFeed>& feed);
    /// Subscribes to the feed of a URL. The feed that there is, if there is one; null, with the
    /// error if there is one, if feeds can't be fetched from there or the agent cannot do it.
    /// Throws `OVException` for a URL that is none.
    std::shared_ptr<OVFeed> addFeedWithURL(const std::string& url,
                                           std::optional<OVError>* error = nullptr);
    /// Ends a subscription; the object is a feed in memory then, as which one may also come. False
    /// for a feed of another client, and if the agent cannot do it.
    bool removeFeed(const std::shared_ptr<OVFeed>& feed);
    /// The feed of a URL, as it was subscribed to; null if there is none. Throws `OVException` for
    /// a URL that is none.
    std::shared_ptr<OVFeed> feedWithURL(const std::string& url) const;
    /// The feed of that `OVFeed::identifier`; null if there is none.
    std::shared_ptr<OVFeed> feedWithIdentifier(const std::string& identifier) const;
    /// Has the agent refresh all feeds, and ask servers for what is new alone, unlike
    /// `OVFeed::refresh`. Returns at once: what comes of it is told as it happens. Throws
    /// `OVException` if the agent cannot be asked.
    void refreshFeeds();
    /// The same for some of them. A feed in memory is refreshed in this process, null is left out.
    void refreshFeeds(const std::vector<std::shared_ptr<OVFeed>>& feeds);

    // Entries.

    /// The entry of that `OVEntry::identifier`; null if no feed of the client has it.
    std::shared_ptr<OVEntry> entryWithIdentifier(const std::string& identifier) const;
    /// The entries that a query asks for, of those that have not expired for this client: by one
    /// statement, whatever it asks, so that only they become objects. Throws `OVException` on
    /// failure.
    OVEntry::List entries(const OVEntryQuery& query) const;
    /// How many there are, without regard to limit and offset. Throws as above.
    std::size_t entryCount(const OVEntryQuery& query) const;
    /// Lets all entries expire that there are now. Throws `OVException` if the agent cannot do it.
    void expireAllEntries();

    // Enclosures.

    /// Those of all entries, in no order.
    std::vector<std::shared_ptr<OVEnclosure>> enclosures() const;
    /// Those whose download was asked for or runs.
    std::vector<std::shared_ptr<OVEnclosure>> enclosuresBeingDownloaded() const;

    bool isEqual(const OVObject* other) const override;
    std::size_t hash() const override;
    /// "OVClient[signature]".
    std::string description() const override;

    /// Whether a change of what an entry's XML has beside the known elements counts as one of the
    /// entry: true at first.
    bool _usesExtensionXML() const;
    /// For this object, while it lives.
    void _setUsesExtensionXML(bool uses);

    OVClientInternal& _internal() const { return *mInternal; }

 private:
    friend class OVObjectMaker;
    explicit OVClient(std::unique_ptr<OVClientInternal> internal);

    std::unique_ptr<OVClientInternal> mInternal;
};
