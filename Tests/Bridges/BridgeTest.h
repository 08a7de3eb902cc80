#pragma once

#include "Bridges/OVAuthorInternal.h"
#include "Bridges/OVClientInternal.h"
#include "Bridges/OVContentInternal.h"
#include "Bridges/OVEnclosureInternal.h"
#include "Bridges/OVEntryInternal.h"
#include "Bridges/OVFeedInternal.h"
#include "Bridges/PublicObject.h"
#include "Bridges/PublicSession.h"
#include "Bridges/RecordingDelegate.h"
#include "Bridges/WritingAgent.h"
#include "Foundation/ApplicationIdentity.h"
#include "Model/ClientTest.h"
#include "Model/EnclosureCore.h"
#include "Model/PublicObjects.h"

#include <Orvane/OVClient.h>
#include <Orvane/OVException.h>

#include <functional>
#include <optional>
#include <string>
#include <vector>

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
