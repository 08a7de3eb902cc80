#pragma once

#include <Orvane/OVDate.h>
#include <Orvane/OVEntry.h>
#include <Orvane/OVError.h>
#include <Orvane/OVFeedSettings.h>
#include <Orvane/OVLink.h>
#include <Orvane/OVObject.h>
#include <Orvane/OVXMLElement.h>

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

class OVClient;
class OVFeedInternal;

/// A feed: one to which a client has subscribed, or one in memory, which the application fetches
/// and looks at without a trace in the database.
///
/// Getters throw `OVException` if the database cannot be read; those that give objects or lists
/// report that in the log instead, and give null or an empty list. Thread: see `OVObject`.
class OV_EXPORT OVFeed : public OVObject {
 public:
    using Text = std::optional<std::string>;  ///< none for what there is not
    using Time = std::optional<OVDate>;       ///< none for what never was
    /// Below 0 if the first entry comes before the second, above 0 if behind it, or else 0.
    using SortDescriptor = std::function<int(const OVEntry&, const OVEntry&)>;

    /// A feed in memory, which has nothing yet but its URL. Null where feeds can't be fetched from.
    /// Throws `OVException` for a URL that is none.
    static std::shared_ptr<OVFeed> create(const std::string& url);
    /// A feed in memory, from a document that the application has and that came from `url`. Null
    /// if that is no feed. Throws `OVException` for a URL that is none.
    static std::shared_ptr<OVFeed> create(std::string_view data, const std::string& url);

    /// The subscription goes on. A feed that is being refreshed lives until that has ended.
    ~OVFeed() override;

    // Subscription.

    /// Whose feed it is; null for one in memory.
    std::shared_ptr<OVClient> client() const;
    /// Those of the subscription; none for a feed in memory that has not been given any. Throws as
    /// getters of values.
    std::optional<OVFeedSettings> settings() const;
    /// None sets `OVFeedSettings::defaultFeedSettings()`. A feed in memory keeps them until it is
    /// added to a client; the list of enclosure types is lost then. Throws `OVException` if the
    /// agent cannot do it.
    void setSettings(const std::optional<OVFeedSettings>& settings);
    /// Keeps the password in the user's store of passwords, for the feed's URL and login. That it
    /// cannot be kept there is reported in the log.
    void setPassword(const std::string& password);
    /// The user name that the server is told.
    Text login() const;
    /// None takes it away. Throws `OVException` if the agent cannot do it.
    void setLogin(const Text& login);

    // Refreshing.

    /// Whether it is being refreshed, as far as this process has been told.
    bool isRefreshing() const;
    /// Starts a refresh, even if the feed is not due: by the agent, or in this process for a feed
    /// in memory. False, with the error, if it could not be started: that of the last refresh if
    /// there is one. `error`, which may be null, is cleared otherwise. That it began is announced
    /// from inside the call, and later what came of it.
    bool refresh(std::optional<OVError>* error = nullptr);
    /// What ended the last refresh; none if nothing did.
    std::optional<OVError> lastError() const;
    /// When the agent will refresh it next; none if it is never due. Throws as getters of values.
    Time nextRefreshDate() const;
    /// When it was last refreshed, whether or not that brought anything. Throws as above.
    Time lastRefreshDate() const;

    // Entries.

    /// How many entries are unread, for this subscription; 0 for a feed in memory.
    int unreadCount() const;
    /// All that have not expired for this subscription, in no order.
    OVEntry::List entries() const;
    /// The same in the order of the first descriptor, where that finds two equal of the second, and
    /// so on.
    OVEntry::List entryEnumeratorSortedBy(const std::vector<SortDescriptor>& descriptors) const;
    /// When the newest one was first seen.
    Time localDateCreatedOfNewestEntry() const;

    // The document.

    /// Its bytes, as they were last fetched.
    Text XMLData() const;
    /// Its root. None if there is no document that can be read.
    std::optional<OVXMLElement> XMLRepresentation() const;
    /// The same, on request without the entries.
    std::optional<OVXMLElement> XMLRepresentationWithEntries(bool withEntries) const;
    /// What stands in it beside entries, in a namespace; without one, outside of its own.
    std::vector<OVXMLElement> extensionXMLElementsUsingNamespace(const Text& uri) const;
    /// Its links, but for those of entries, in its order.
    std::vector<OVLink> links() const;

    // What it says of itself.

    /// The text that tells the feed in all databases of the user.
    Text identifier() const;
    /// Plain text, as all of these.
    Text title() const;
    Text subtitle() const;
    /// Who may do what with it.
    Text rights() const;
    /// When it last changed, by its own account.
    Time dateUpdated() const;
    /// That date's, such as "Europe/Berlin" or "GMT+02:00".
    Text timeZoneUpdated() const;
    /// As subscribed to. All URLs are absolute.
    Text URL() const;
    /// That of the web page.
    Text alternateURL() const;
    /// That of a small picture.
    Text iconURL() const;
    /// That of a larger one.
    Text logoURL() const;
    /// Where the last fetch was sent on to; none if it was not.
    Text redirectedURL() const;
    /// When what is stored last changed.
    Time localDateUpdated() const;
    /// 1 for RSS, 2 for Atom, 0 if it has not been fetched.
    int feedFormat() const;

    /// By the feed itself: two clients' objects of one feed are equal.
    bool isEqual(const OVObject* other) const override;
    std::size_t hash() const override;
    /// "OVFeed[<URL> row/row]", with the IDs of feed and subscription, 0 in memory.
    std::string description() const override;

    OVFeedInternal& _internal() const { return *mInternal; }

 private:
    friend class OVObjectMaker;
    explicit OVFeed(std::unique_ptr<OVFeedInternal> internal);

    std::unique_ptr<OVFeedInternal> mInternal;
};
