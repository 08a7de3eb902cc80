#pragma once

#include "Model/AgentLink.h"

namespace Orvane {

/// The link where there is no agent to be asked: all calls fail as if it could not be started, and
/// the first one is logged. Also a base for links that can do only some of the calls.
class UnreachableAgent : public AgentLink {
 public:
    void fixDatabase(int code) override;
    ClientCore* createClient(String* signature) override;
    void markClientInUse(ClientCore* client) override;
    void expireAllEntries(ClientCore* client) override;
    void setPrivate(ClientCore* client, bool value) override;
    SubscriptionCore* createSubscription(ClientCore* client, URL* url,
                                         Dictionary* settings) override;
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
};

}  // namespace Orvane
