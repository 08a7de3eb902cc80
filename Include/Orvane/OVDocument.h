#pragma once

#include <Orvane/OVBase.h>
#include <Orvane/OVLink.h>

#include <chrono>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// What a document of bytes from anywhere turned out to be: a feed, a single entry, a web page with
/// its links, a person, or nothing. A plain value, to look at: nothing of it reaches the database.
///
/// Texts are UTF-8. A text, a time or a part that the document has not got is empty.
struct OVDocument {
    /// In UTF-8; none where the document says nothing.
    using Text = std::optional<std::string>;
    using Time = std::optional<std::chrono::sys_seconds>;

    /// What the document is.
    enum class Kind { Unknown, Page, Feed, Entry, Friend };
    /// The family of a feed's or an entry's vocabulary.
    enum class Format { Unknown = 0, RSS = 1, Atom = 2 };
    /// How the contents of entries are wanted.
    enum class Contents {
        AsStored,  ///< as the document has them, its own escapes undone
        Tidied,    ///< as they are shown: repaired, and safe; none where that fails
    };
    /// What a link leads to.
    using LinkKind = OVLink::Kind;

    /// A person who wrote entries.
    struct Author {
        /// What the document says of the author.
        Text name, email, url;
    };
    /// What an entry has to be read.
    struct Content {
        std::string data;       ///< a text, unless `isBinary`
        Text type;              ///< a media type
        bool isBinary = false;  ///< the bytes may be anything
    };
    /// A file that belongs to an entry.
    struct Enclosure {
        /// Where it is, and what it says of it.
        Text url, mimeType, title;
        long long length = 0;  ///< in bytes, as the document says; 0 if it says nothing
    };
    /// An entry, as the document has it.
    struct Entry {
        /// What the document says of it, by the names that Atom has for that.
        Text id, title, rights, alternateURL, baseURL;
        std::optional<Author> author;
        std::optional<Content> content, summary;
        Time dateCreated, datePublished, dateUpdated;
        std::vector<Enclosure> enclosures;
        Text xmlHash;  ///< the SHA-1 of the entry's own XML
    };
    /// A link that stands outside of entries.
    struct Link {
        /// The attributes, as they are written.
        Text rel, type, title;
        Text href;  ///< as it is written
        Text url;   ///< absolute; empty for what is no fit target of a click
        LinkKind kind = LinkKind::Nothing;  ///< by all of these
    };
    /// What a feed's document says of the feed.
    struct Feed {
        /// By the names that Atom has for them.
        Text title, subtitle, id, rights, alternateURL, iconURL, logoURL, url;
        Time dateUpdated;
    };
    /// What a web page's head says.
    struct Page {
        Text base;                ///< what its relative URLs count from
        std::vector<Link> links;  ///< in the order of the page
    };
    /// A person of a FOAF document.
    struct Friend {
        /// By the names that FOAF has for them.
        Text name, firstName, familyName, nick, url;
        std::vector<Friend> knows;
    };

    /// Reads a document. `url`, which may be empty, is the document's own: relative URLs in it
    /// count from there. Throws `OVException` for a `url` that is not absolute; never for bad
    /// bytes.
    ///
    /// The thread that runs the library's run loop, one document at a time.
    OV_EXPORT static OVDocument read(std::string_view bytes, const std::string& url = {},
                                     Contents contents = Contents::AsStored);

    /// What was found.
    Kind kind = Kind::Unknown;
    Format format = Format::Unknown;
    int attempts = 0;  ///< that were made at reading it: from 1 to 4
    Text tidiedWith;   ///< the class of the tidier that repaired it; empty if it was read as it is
    /// The one of these that `kind` names.
    std::optional<Feed> feed;
    std::optional<Page> page;
    std::optional<Friend> person;
    std::vector<Entry> entries;  ///< of the feed, in the document's order, or the single one
    std::vector<Link> links;     ///< that stand outside of entries, of whatever kind
    /// What entries got that name nobody, and no time.
    std::vector<Author> defaultAuthors, defaultContributors;
    Time defaultTimePublished;
};
