#pragma once

#include "Foundation/NetError.h"
#include "SQLite/Types.h"

namespace Foundation {
class Dictionary;
class String;
class URL;
template <class T>
class ArrayOf;
}  // namespace Foundation

namespace Orvane {

class AuthorCore;
class ClientCore;
class ContentCore;
class EnclosureCore;
class EntryCore;
class FeedCore;
class SubscriptionCore;

/// What rows of a read-only connection ask the agent, which alone writes. Each call blocks until
/// the agent has done it and saved it, at most for the time that calls may take. It does not touch
/// the row's columns, unless it says so: the caller makes them be read anew.
///
/// A call that fails throws `NetException`: {1002, 202} if no agent can be started, {1002, 203} if
/// the call gets lost, otherwise the error that the agent answered. Rows that are handed out are
/// kept by the current pool. Not to be called within a transaction: the agent could wait for it.
class AgentLink {
 public:
    using Dictionary = Foundation::Dictionary;
    using NetError = Foundation::NetError;
    using RowID = SQLite::RowID;
    using String = Foundation::String;
    using URL = Foundation::URL;

    enum EnclosureAction : int { kDownload = 0, kCheck = 1, kCancel = 2, kDelete = 3 };

    virtual ~AgentLink() = default;

    /// Sees to it that there is a database in order. `code` is sqlite3's error. Takes minutes.
    virtual void fixDatabase(int code) = 0;

    /// The new client of that signature, or the one that there is.
    virtual ClientCore* createClient(String* signature) = 0;
    virtual void markClientInUse(ClientCore* client) = 0;
    virtual void expireAllEntries(ClientCore* client) = 0;
    virtual void setPrivate(ClientCore* client, bool value) = 0;

    /// Null if the agent could not make one of that URL. `settings` may be null.
    virtual SubscriptionCore* createSubscription(ClientCore* client, URL* url,
                                                 Dictionary* settings) = 0;
    /// Intervals in seconds and the size in bytes lose their fractions. `enclosureTypes` may be
    /// null.
    virtual void updateSubscription(SubscriptionCore* subscription, double refreshInterval,
                                    double expirationInterval, bool refreshesInBackground,
                                    bool downloadsEnclosures, double maxEnclosureSize,
                                    Foundation::ArrayOf<String>* enclosureTypes) = 0;
    virtual void deleteSubscription(SubscriptionCore* subscription) = 0;

    /// Starts a refresh, a forced one if so. Unloads the row if the result has no code; that the
    /// refresh could not be started does not show in it.
    virtual NetError refresh(FeedCore* feed, bool force) = 0;
    /// The same for many feeds; none is no call.
    virtual void refreshMultiple(const RowID* feeds, unsigned count, bool force) = 0;
    virtual void recoverOldEntries(FeedCore* feed) = 0;
    virtual void setLogin(FeedCore* feed, String* login) = 0;

    virtual void setRead(EntryCore* entry, bool value) = 0;
    virtual void setFlagged(EntryCore* entry, bool value) = 0;
    /// The same for many entries; none is no call. A value below 0 leaves the state alone.
    virtual void setFlags(const RowID* entries, unsigned count, int read, int flagged) = 0;
    /// `column` is "content", "summary" or "XMLRepresentation"; null clears it.
    virtual void setContent(EntryCore* entry, const char* column, ContentCore* content) = 0;
    /// Null clears it.
    virtual void setAuthor(EntryCore* entry, AuthorCore* author) = 0;

    /// The author with these values, made if need be; null if name, email and URL are all null.
    virtual AuthorCore* createAuthor(String* name, String* email, URL* url,
                                     String* contactBookUID) = 0;
    virtual void setContactBookUID(AuthorCore* author, String* uid) = 0;

    /// Whether the agent has taken it.
    virtual bool enclosureAction(EnclosureCore* enclosure, int action) = 0;

    /// Starts a sync with the user's other machines soon. Whether the agent does.
    virtual bool startSync() { return false; }
    /// Sees to it that the end of the agent, if one runs, is announced in the local centre. Whether
    /// it will be.
    virtual bool listenForAgentDeath() { return false; }

    /// The link of the process; an `UnreachableAgent` until one is set.
    static AgentLink& current();
    /// The link must outlive its use. Null takes it away.
    static void setCurrent(AgentLink* link);
    /// What makes the link, at the first use without one that is set. Null takes it away.
    using Maker = AgentLink* (*)();
    static void setMaker(Maker maker);
};

}  // namespace Orvane
