#pragma once

#include <Orvane/OVAuthor.h>
#include <Orvane/OVContent.h>
#include <Orvane/OVDate.h>
#include <Orvane/OVEnclosure.h>
#include <Orvane/OVObject.h>
#include <Orvane/OVXMLElement.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

class OVEntryInternal;
class OVFeed;

/// An entry of a feed.
///
/// Getters throw `OVException` if the database cannot be read; those that give objects or lists
/// report that in the log instead, and give null or an empty list. Thread: see `OVObject`.
class OV_EXPORT OVEntry : public OVObject {
 public:
    using Text = std::optional<std::string>;  ///< none for what there is not
    using Time = std::optional<OVDate>;       ///< none for what is not known
    /// None of them is null.
    using List = std::vector<std::shared_ptr<OVEntry>>;

    /// The entry stays in the database.
    ~OVEntry() override;

    // Identity and place.

    /// Whether it is in the database, and not one of a feed in memory.
    bool isPersistent() const;
    /// The feed by which it was found, or else its client's subscription to its feed; null if none
    /// of them is known.
    std::shared_ptr<OVFeed> feed() const;
    /// The text that tells the entry in all databases of the user.
    Text identifier() const;

    // What the feed says.

    /// Plain text.
    Text title() const;
    /// Who may do what with it, in plain text.
    Text rights() const;
    /// That of the web page, absolute.
    Text alternateURL() const;
    /// What the relative URLs of the entry count from.
    Text baseURL() const;
    /// When its author began it.
    Time dateCreated() const;
    /// The zone of that date, such as "Europe/Berlin" or "GMT+02:00".
    Text timeZoneCreated() const;
    /// When it was first to be seen by all.
    Time datePublished() const;
    /// The zone of that date, as above.
    Text timeZonePublished() const;
    /// When it last changed, by its own account.
    Time dateUpdated() const;
    /// The zone of that date, as above.
    Text timeZoneUpdated() const;
    /// All of its text; null if the feed has not got that.
    std::shared_ptr<OVContent> content() const;
    /// What it is about; null if the feed does not say.
    std::shared_ptr<OVContent> summary() const;
    /// Who wrote it.
    std::vector<std::shared_ptr<OVAuthor>> authors() const;
    /// Who helped.
    std::vector<std::shared_ptr<OVAuthor>> contributors() const;
    /// The files that it has attached.
    std::vector<std::shared_ptr<OVEnclosure>> enclosures() const;

    // What happened to it here.

    /// When it was first seen.
    Time localDateCreated() const;
    /// When its data last changed.
    Time localDateUpdated() const;

    // For people.

    /// When it was published, or else updated, or else first seen.
    Time dateForDisplay() const;
    /// The title or, without one, the beginning of its text in quotes, at most 120 characters on
    /// one line. Empty if it has neither.
    std::string titleForDisplay() const;
    /// Its authors, with ", " in between; empty if there are none.
    std::string authorsForDisplay() const;

    // As XML.

    /// The entry as an element of Atom. None without one, and on failure.
    std::optional<OVXMLElement> XMLRepresentation() const;
    /// The children of that in a namespace; without one, those outside of the entry's own.
    std::vector<OVXMLElement> extensionXMLElementsUsingNamespace(const Text& uri) const;

    // State.

    /// Whether the feed's document still has it.
    bool isCurrent() const;
    /// The same.
    bool current() const { return isCurrent(); }
    /// Whether the user has read it.
    bool isRead() const;
    /// The same.
    bool read() const { return isRead(); }
    /// Whether the user has flagged it.
    bool isFlagged() const;
    /// The same.
    bool flagged() const { return isFlagged(); }
    /// Throws `OVException` if the agent cannot do it.
    void setRead(bool read);
    /// Throws as above.
    void setFlagged(bool flagged);

    /// Sets the state of many entries by one call to the agent; null is left out. A failure is
    /// reported in the log.
    static void setEntries(const List& entries, bool read);
    /// The same for both states; none leaves one as it is. Throws `OVException` if the agent cannot
    /// do it.
    static void setFlags(const List& entries, std::optional<bool> read,
                         std::optional<bool> flagged);

    /// "OVEntry['title' row]", with the title if it has been read, and the row's ID.
    std::string description() const override;
    bool isEqual(const OVObject* other) const override;
    std::size_t hash() const override;

    OVEntryInternal& _internal() const { return *mInternal; }

 private:
    friend class OVObjectMaker;
    explicit OVEntry(std::unique_ptr<OVEntryInternal> internal);

    std::unique_ptr<OVEntryInternal> mInternal;
};
