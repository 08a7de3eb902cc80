#pragma once

#include <Orvane/OVDate.h>

#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <vector>

class OVFeed;

/// Which entries of a client are wanted, in which order, and how many of them. What is left as it
/// is says nothing. See `OVClient::entries` and `OVClient::entryCount`.
struct OVEntryQuery {
    /// The dates by which entries can be chosen and sorted.
    enum class Date {
        Received,    ///< when the entry was first seen here: the fastest
        ForDisplay,  ///< when it was published, or else updated, or else first seen
    };
    /// What entries are sorted by.
    enum class Order {
        ByDate,
        ByTitle,  ///< without regard to case in ASCII
        ByFeed,   ///< by the title of the feed, as above
    };

    /// Only of these feeds; all of the client's if there are none. One that is not the client's,
    /// and null, has no entries.
    std::vector<std::shared_ptr<OVFeed>> feeds;
    /// Only those whose identifier begins with this.
    std::string identifierPrefix;
    /// Only those of this web page.
    std::string alternateURL;
    /// Only those that the user has read, or has not.
    std::optional<bool> read;
    /// Only those that the user has flagged, or has not.
    std::optional<bool> flagged;
    /// Only from this date on.
    std::optional<OVDate> from;
    /// Only before this date.
    std::optional<OVDate> before;
    /// Only those in whose title, summary or content each of these words stands, also as a part of
    /// another word. Case counts outside of ASCII.
    std::vector<std::string> words;
    /// Only those in whose author's name or address this stands. Case as above.
    std::string author;
    /// Only those that have files attached, or have none.
    std::optional<bool> hasEnclosures;

    /// The date that `from`, `before` and the order go by.
    Date date = Date::Received;
    /// Equal ones go by date, and then as they came into the database.
    Order order = Order::ByDate;
    /// The oldest first, or titles from A on. Otherwise the other way round.
    bool ascending = false;
    /// At most so many; 0 for all.
    std::size_t limit = 0;
    /// Leaves out so many at the start.
    std::size_t offset = 0;
};
