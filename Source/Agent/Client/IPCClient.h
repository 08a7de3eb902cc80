#pragma once

#include "Agent/RPC/IPCConnection.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"
#include "Model/AgentLink.h"

#include <cstdint>
#include <span>

namespace Orvane {

/// A client's calls to the agent: turns rows into the arguments of its routines, and results into
/// rows. See `AgentLink` for what each of them does. The main thread of the application.
class IPCClient : public IPCConnection, public AgentLink {
 public:
    static constexpr int kFixTimeoutMS = 120000;

    /// Made on first use, which looks the agent up, and never destroyed.
    static IPCClient* instance();
    /// Makes the instance the link of the process's rows, once one of them asks for it.
    static void connect();

    void fixDatabase(int code) override;
    /// Where a server of the agent listens: "Render". Null if there is none of that name. Throws
    /// `AssertionFailure` for null.
    Foundation::StringReturner getSocketPath(const char* name);
    /// Whether a sync with the user's other machines begins.
    bool startSkerrySync();
    bool startSync() override { return startSkerrySync(); }
    bool listenForAgentDeath() override { return IPCConnection::listenForAgentDeath(); }

    ClientCore* createClient(String* signature) override;
    void markClientInUse(ClientCore* client) override;
    void expireAllEntries(ClientCore* client) override;
    void setPrivate(ClientCore* client, bool value) override;

    SubscriptionCore* createSubscription(ClientCore* client, URL* url,
                                         Dictionary* settings) override;
    /// Takes the values of "refreshInterval", "expirationInterval", "refreshesInBackground",
    /// "downloadsEnclosures", "maxEnclosureSize" and "enclosureTypesString"; what is not there
    /// counts as 0.
    void updateSubscription(SubscriptionCore* subscription, Dictionary* settings);
    void updateSubscription(SubscriptionCore* subscription, double refreshInterval,
                            double expirationInterval, bool refreshesInBackground,
                            bool downloadsEnclosures, double maxEnclosureSize,
                            Foundation::ArrayOf<String>* enclosureTypes) override;
    void deleteSubscription(SubscriptionCore* subscription) override;

    NetError refresh(FeedCore* feed, bool force) override;
    void refreshMultiple(const RowID* feeds, unsigned count, bool force) override;
    void recoverOldEntries(FeedCore* feed) override;
    void setLogin(FeedCore* feed, String* login) override;

    void setRead(EntryCore* entry, bool value) override;
    void setFlagged(EntryCore* entry, bool value) override;
    void setFlags(const RowID* entries, unsigned count, int read, int flagged) override;
    void setContent(EntryCore* entry, const char* column, ContentCore* content) override;
    void setAuthor(EntryCore* entry, AuthorCore* author) override;

    AuthorCore* createAuthor(String* name, String* email, URL* url,
                             String* contactBookUID) override;
    void setContactBookUID(AuthorCore* author, String* uid) override;

    bool enclosureAction(EnclosureCore* enclosure, int action) override;

    /// The UTF-8 of a text or URL, which lives as long as that; none for null.
    static std::span<const std::uint8_t> miggify(const String* text);
    static std::span<const std::uint8_t> miggify(const URL* url);

 private:
    IPCClient() = default;

    void setSettings(SubscriptionCore* subscription, double refreshInterval,
                     double expirationInterval, bool refreshesInBackground,
                     bool downloadsEnclosures, double maxEnclosureSize,
                     const String* enclosureTypes);
};

}  // namespace Orvane
