#pragma once

#include "Bridges/OVAuthorInternal.h"
#include "Bridges/OVClientInternal.h"
#include "Bridges/OVContentInternal.h"
#include "Bridges/OVEnclosureInternal.h"
#include "Bridges/OVEntryInternal.h"
#include "Bridges/OVFeedInternal.h"
#include "Bridges/PublicObjectFactory.h"
#include "Bridges/PublicSession.h"
#include "Foundation/ApplicationIdentity.h"
#include "Foundation/NetException.h"
#include "Model/ClientTest.h"
#include "Model/EnclosureCore.h"

#include <Orvane/OVClient.h>
#include <Orvane/OVException.h>
#include <Orvane/OVNotificationCenter.h>

#include <algorithm>
#include <functional>
#include <optional>
#include <string>
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

/// A delegate that writes down what it is told.
class RecordingDelegate : public OVClientDelegate {
 public:
    using Feed = std::shared_ptr<OVFeed>;

    void feedDidBeginRefresh(const Feed& feed) override { note("begin", feed); }
    void feedDidEndRefresh(const Feed& feed) override { note("end", feed); }
    void feedDidAddEntries(const Feed& feed, const OVEntry::List& entries) override {
        note("added" + names(entries), feed);
    }
    void feedDidRemoveEntriesWithIdentifiers(const Feed& feed,
                                             const std::vector<std::string>& all) override {
        std::string text;
        for (const std::string& each : all) {
            text += " " + each;
        }
        note("removed" + text, feed);
    }
    void feedDidUpdateEntries(const Feed& feed, const OVEntry::List& entries) override {
        note("updated" + names(entries), feed);
    }
    void feedDidChangeFlagsInEntries(const Feed& feed, const OVEntry::List& entries) override {
        note("flags" + names(entries), feed);
    }
    void feedUnreadCountChanged(const Feed& feed) override { note("count", feed); }

    std::vector<std::string> told;
    std::shared_ptr<OVFeed> lastFeed;
    std::function<void()> also;

 private:
    static std::string names(const OVEntry::List& entries) {
        std::vector<std::string> all;
        for (const std::shared_ptr<OVEntry>& each : entries) {
            all.push_back(each->identifier().value_or("?"));
        }
        std::sort(all.begin(), all.end());
        std::string text;
        for (const std::string& each : all) {
            text += " " + each;
        }
        return text;
    }
    void note(const std::string& what, const Feed& feed) {
        told.push_back(what);
        lastFeed = feed;
        if (also) also();
    }
};

/// The names of what is announced in the application's centre, while this lives.
class PublicRecorder {
 public:
    std::vector<std::string> names;
    OVNotification last;

 private:
    OVNotificationCenter::Observation mObservation =
        OVNotificationCenter::defaultCenter().addObserver({}, nullptr,
                                                          [this](const OVNotification& posted) {
                                                              names.push_back(posted.name);
                                                              last = posted;
                                                          });
};

/// A test of the public objects. The process is an application's, which only reads; what is in the
/// database is written with SQL, as the agent would.
class BridgeTest : public ClientTest {
 protected:
    static constexpr const char* kMe = "org.example.Me";
    static constexpr double kNow = Support::ManualClock::kStart;

    BridgeTest() {
        Foundation::ApplicationIdentity::_forget();
        Foundation::ApplicationIdentity::setIdentifier(kMe);
        Orvane::PublicSession::connect();
        becomeReader();
        agent.emplace(path);
    }
    ~BridgeTest() noexcept override {
        Orvane::PublicObjects::setCurrent(nullptr);
        Orvane::DocumentParser::setCurrent(nullptr);
        OVClientInternal::applicationClient() = nullptr;
        Foundation::ApplicationIdentity::_forget();
    }

    /// Makes rows, as the agent would.
    void write(const std::string& sql) { agent->write(sql); }
    /// Brings what was written to the process, as the bus would, and lets it handle that.
    void announce() {
        const auto posts = std::exchange(platform.posts, {});
        for (const FakeCenter::Post& post : posts) {
            platform.deliver(post.name.c_str(), post.object, post.info);
        }
        clock.advanceBy(0);
    }
    /// The agent says something of a feed, or of an enclosure.
    void deliver(const char* name, const std::string& object) {
        platform.deliver(name, object, nullptr);
    }

    /// The application's client, with rows of feeds and entries of its own.
    std::shared_ptr<OVClient> me() {
        std::shared_ptr<OVClient> client = OVClient::applicationClient();
        agent->calls.clear();
        return client;
    }
    /// A feed to which the application has subscribed; gives the feed's ID.
    long long addFeed(const std::string& url, const std::string& title = "A feed") {
        const std::shared_ptr<OVClient> client = me();
        write(OVFormat("insert into Feeds (url,identifier,title) values ('%s','id-%s','%s')", url,
                       url, title));
        const long long feed = db().execScalar("select max(rowID) from Feeds");
        agent->addSubscription(client->_internal().core().getRowID(), feed);
        return feed;
    }
    /// An entry first seen so many seconds from now; gives its ID.
    long long addEntry(long long feed, const std::string& identifier, double age = -100,
                       const std::string& title = "Title") {
        const double time = kNow + age;
        write(
            OVFormat("insert into Entries (feed,identifier,title,read,flagged,current,"
                     "localDateCreated,localDateUpdated,localDateXmlChanged,"
                     "localDateFlagsUpdated) values (%lli,'%s','%s',0,0,1,%f,%f,%f,0)",
                     feed, identifier, title, time, time, time));
        return db().execScalar("select max(rowID) from Entries");
    }
    std::shared_ptr<OVFeed> feedOf(const char* url = kAddress) { return me()->feedWithURL(url); }

    /// What an operation of the public interface says that it throws; "none" if it throws nothing.
    static std::string exceptionOf(const std::function<void()>& body) {
        try {
            body();
        } catch (const OVException& exception) {
            return exception.what();
        }
        return "none";
    }

    std::optional<WritingAgent> agent;
    using Strings = std::vector<std::string>;
};
