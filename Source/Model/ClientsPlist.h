#pragma once

#include "Foundation/Returner.h"

namespace Foundation {
class Dictionary;
class URL;
}  // namespace Foundation

namespace Orvane {

/// The file that says which clients subscribe to which feeds, and how: what a database that broke
/// is made anew from. An XML property list with three dictionaries, of which each has dictionaries
/// by row ID in decimal. What is none, false or 0 has no key.
///
///     Clients        Signature (string), Private (true), DateUsed (date)
///     Feeds          URL, Login (strings)
///     Subscriptions  Client, Feed (row IDs; no Feed in a settings row), RefreshInterval,
///                    ExpirationInterval, MaxEnclosureSize (numbers), RefreshesInBackground,
///                    DownloadsEnclosures (true), EnclosureTypes (string)
struct ClientsPlist {
    static constexpr const char* kClients = "Clients";
    static constexpr const char* kFeeds = "Feeds";
    static constexpr const char* kSubscriptions = "Subscriptions";

    static constexpr const char* kSignature = "Signature";
    static constexpr const char* kPrivate = "Private";
    static constexpr const char* kDateUsed = "DateUsed";
    static constexpr const char* kURL = "URL";
    static constexpr const char* kLogin = "Login";
    static constexpr const char* kClient = "Client";
    static constexpr const char* kFeed = "Feed";
    static constexpr const char* kRefreshInterval = "RefreshInterval";
    static constexpr const char* kExpirationInterval = "ExpirationInterval";
    static constexpr const char* kRefreshesInBackground = "RefreshesInBackground";
    static constexpr const char* kDownloadsEnclosures = "DownloadsEnclosures";
    static constexpr const char* kMaxEnclosureSize = "MaxEnclosureSize";
    static constexpr const char* kEnclosureTypes = "EnclosureTypes";

    /// What the file is to hold: each subscription of the database of the process, and the clients
    /// and feeds that they reach. One whose client or feed is not there is reported and left out.
    /// Throws `SQLite::Exception`.
    static Foundation::Returner<Foundation::Dictionary> describeDatabase();

    /// What the file at `url` holds. Null, with a warning, if it cannot be read or is no property
    /// list with a dictionary.
    static Foundation::Returner<Foundation::Dictionary> read(Foundation::URL* url);
    /// Replaces the file at `url` in one step. One that is there and cannot be read is kept beside
    /// it as "Clients-unreadable.plist" or under the next free name like it. False, with a warning
    /// and the file as it was, if that fails.
    static bool write(const Foundation::Dictionary* root, Foundation::URL* url);
};

}  // namespace Orvane
