#pragma once

#include "Foundation/ArrayOf.h"
#include "Foundation/Clock.h"
#include "Foundation/Dictionary.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/NetException.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"
#include "Model/AuthorCore.h"
#include "Model/ClientCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/SubscriptionCore.h"
#include "Model/UnreachableAgent.h"
#include "SQLite/Database.h"

#include <string>
#include <utility>
#include <vector>

/// An agent that writes down what it is asked and does it by a connection of its own, which is
/// announced when the test says. It is the link of the process while it lives.
class WritingAgent : public Orvane::UnreachableAgent {
 public:
    explicit WritingAgent(std::string path) : mPath(std::move(path)) { setCurrent(this); }
    ~WritingAgent() override { setCurrent(nullptr); }

    Orvane::ClientCore* createClient(String* signature) override {
        note(OVFormat("createClient(%@)", signature));
        write(OVFormat("insert into Clients (signature,private,dateUsed) values ('%@',0,%f)",
                       signature, Foundation::Clock::current().now()));
        const Foundation::Ref<Orvane::ClientCore> made =
            Orvane::ClientCore::existingClientWithSignature(signature);
        addSubscription(made->getRowID(), 0);
        return made.get();
    }
    void markClientInUse(Orvane::ClientCore*) override { note("markInUse"); }
    void expireAllEntries(Orvane::ClientCore*) override { note("expireAll"); }
    void setPrivate(Orvane::ClientCore* client, bool value) override {
        note(OVFormat("setPrivate(%d)", value));
        write(
            OVFormat("update Clients set private=%d where rowID=%lli", value, client->getRowID()));
    }
    Orvane::SubscriptionCore* createSubscription(Orvane::ClientCore* client, URL* url,
                                                 Dictionary* settings) override {
        note(OVFormat("createSubscription(%@,%@)", url, settings));
        if (refusesFeeds) return nullptr;
        const Foundation::Ref<Orvane::SubscriptionCore> present = client->getSubscription(url);
        if (present.get()) return present.get();
        write(
            OVFormat("insert or ignore into Feeds (url,identifier,title) values "
                     "('%@','id-%@','made')",
                     url, url));
        SQLite::Database& database = *SQLite::gDatabase;
        const long long made = addSubscription(
            client->getRowID(),
            database.execScalar("select rowID from Feeds where url=%Q", std::string(url->text())));
        return Orvane::SubscriptionCore::getRow(made);
    }
    void updateSubscription(Orvane::SubscriptionCore* row, double refresh, double expiration,
                            bool background, bool downloads, double size,
                            Foundation::ArrayOf<String>* types) override {
        note(OVFormat("updateSubscription(%.0f,%.0f,%d,%d,%.0f,%@)", refresh, expiration,
                      background, downloads, size, types));
        write(
            OVFormat("update Subscriptions set refreshInterval=%.0f,expirationInterval=%.0f,"
                     "refreshesInBackground=%d,downloadsEnclosures=%d,maxEnclosureSize=%.0f "
                     "where rowID=%lli",
                     refresh, expiration, background, downloads, size, row->getRowID()));
    }
    void deleteSubscription(Orvane::SubscriptionCore* row) override {
        note("deleteSubscription");
        write(OVFormat("delete from Subscriptions where rowID=%lli", row->getRowID()));
    }
    NetError refresh(Orvane::FeedCore*, bool force) override {
        note(OVFormat("refresh(%d)", force));
        return {};
    }
    void refreshMultiple(const RowID* feeds, unsigned count, bool force) override {
        note(OVFormat("refreshMultiple(%s,%d)", list(feeds, count), force));
    }
    void setLogin(Orvane::FeedCore* feed, String* login) override {
        note(OVFormat("setLogin(%@)", login));
        write(OVFormat("update Feeds set login='%@' where rowID=%lli", login, feed->getRowID()));
    }
    void setRead(Orvane::EntryCore* entry, bool value) override {
        note(OVFormat("setRead(%d)", value));
        write(OVFormat("update Entries set read=%d where rowID=%lli", value, entry->getRowID()));
    }
    void setFlagged(Orvane::EntryCore* entry, bool value) override {
        note(OVFormat("setFlagged(%d)", value));
        write(OVFormat("update Entries set flagged=%d where rowID=%lli", value, entry->getRowID()));
    }
    void setFlags(const RowID* entries, unsigned count, int read, int flagged) override {
        note(OVFormat("setFlags(%s,%d,%d)", list(entries, count), read, flagged));
        for (unsigned i = 0; i < count; ++i) {
            if (read >= 0) {
                write(OVFormat("update Entries set read=%d where rowID=%lli", read, entries[i]));
            }
        }
    }
    void setContactBookUID(Orvane::AuthorCore* author, String* uid) override {
        note(OVFormat("setContactBookUID(%@)", uid));
        write(OVFormat("update Authors set contactBookUid='%@' where rowID=%lli", uid,
                       author->getRowID()));
    }
    Orvane::AuthorCore* createAuthor(String* name, String*, URL*, String*) override {
        note(OVFormat("createAuthor(%@)", name));
        return createdAuthor;
    }
    bool enclosureAction(Orvane::EnclosureCore*, int action) override {
        note(OVFormat("enclosureAction(%d)", action));
        return answer;
    }
    bool startSync() override {
        note("startSync");
        return answer;
    }
    bool listenForAgentDeath() override {
        ++listened;
        return true;
    }

    /// Writes to the file as the agent would.
    void write(const std::string& sql) const {
        SQLite::Database other;
        other.open(mPath.c_str(), true);
        other.setPostsNotifications(true);
        other.beginTransaction(true);
        other.execute("%s", sql);
        other.endTransaction();
    }
    /// A new subscription, of no feed for 0. Gives its ID.
    long long addSubscription(long long client, long long feed) const {
        write(
            OVFormat("insert into Subscriptions (client,feed,refreshInterval,expirationInterval,"
                     "expirationDate,refreshesInBackground,downloadsEnclosures,maxEnclosureSize,"
                     "unreadCount) values (%lli,%lli,%d,%d,0,1,0,8388608,0)",
                     client, feed, feed ? 0 : 1800, feed ? 0 : 1209600));
        return SQLite::gDatabase->execScalar("select max(rowID) from Subscriptions");
    }

    std::vector<std::string> calls;
    int listened = 0;
    bool fails = false;  ///< cannot be reached
    bool refusesFeeds = false;
    bool answer = true;
    Orvane::AuthorCore* createdAuthor = nullptr;

 private:
    static std::string list(const RowID* ids, unsigned count) {
        std::string text;
        for (unsigned i = 0; i < count; ++i) {
            text += (i ? " " : "") + std::to_string(ids[i]);
        }
        return text;
    }
    void note(const std::string& call) {
        calls.push_back(call);
        if (fails) throw Foundation::NetException(NetError::kOrvane, OVAgentLaunchError);
    }

    const std::string mPath;
};
