// A client's session on the database that an agent in another process makes and changes.

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Bus.h"
#include "Foundation/URL.h"
#include "Model/ClientCore.h"
#include "Model/FeedCore.h"
#include "Model/OldSchema.h"
#include "Model/SubscriptionCore.h"
#include "Model/UnreachableAgent.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"
#include "SQLite/Exception.h"
#include "Support/ChildProcess.h"
#include "Support/LogCapture.h"
#include "Support/PrivateBus.h"
#include "Support/TempDir.h"
#include "Support/TurnUntil.h"
#include "Utilities/FileSystem.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

using namespace Foundation;
using namespace Orvane;
using Support::turnUntil;
namespace fs = std::filesystem;

namespace {

/// Starts an agent for each call, which ends before the call does.
class StartedAgent : public UnreachableAgent {
 public:
    explicit StartedAgent(std::string base) : mBase(std::move(base)) { setCurrent(this); }
    ~StartedAgent() override { setCurrent(nullptr); }

    void fixDatabase(int code) override {
        codes.push_back(code);
        run({});
    }
    ClientCore* createClient(String* signature) override {
        return ClientCore::getRow(std::stoll(run({"client", signature->utf8()})));
    }
    void markClientInUse(ClientCore*) override { run({"use", ""}); }

    /// Gives what it says.
    std::string run(std::vector<std::string> steps) {
        steps.insert(steps.begin(), {SESSION_AGENT, mBase});
        const Support::ChildResult result = Support::runChild(steps);
        EXPECT_EQ(result.status, 0) << result.err;
        return result.out;
    }

    std::vector<int> codes;

 private:
    const std::string mBase;
};

class SessionProcess : public testing::Test {
 protected:
    SessionProcess() {
        SQLite::Database::initialize();
        const Ref<URL> url = URL::urlWithFileSystemPath(base.path().c_str(), true);
        Compatibility::FileSystem::setStorageBaseURL(url);
        fs::create_directories(file().parent_path());
    }
    ~SessionProcess() noexcept override {
        SQLite::gDatabase->close(false);
        Compatibility::FileSystem::setStorageBaseURL(nullptr);
    }

    fs::path file() const { return base.path() / "Orvane/Database/Database.sqlite3"; }
    static ClientCore* newClient() {
        const Ref<String> signature = String::string("org.example.Reader");
        return ClientCore::createClient(signature);
    }
    static ClientCore* find(String* signature) {
        return ClientCore::existingClientWithSignature(signature);
    }
    static int version() { return SQLite::gDatabase->getUserVersion(); }

    AutoreleasePool pool;
    Support::PrivateBus bus;
    Support::TempDir base;
    Support::LogCapture log;
    StartedAgent agent{base.path().string()};
};

}  // namespace

TEST_F(SessionProcess, BeginsWithTheDatabaseThatTheAgentMakes) {
    ClientCore::openClientSession();
    EXPECT_EQ(agent.codes, std::vector<int>{12});
    EXPECT_FALSE(SQLite::gDatabase->isWriteable());
    EXPECT_EQ(version(), 10022);
    const Ref<ClientCore> client = newClient();
    EXPECT_EQ(client->mSignature.getValue()->utf8(), "org.example.Reader");
    EXPECT_EQ(client->getDefaultSubscription()->mRefreshInterval, 1800);
    EXPECT_EQ(newClient(), client.get());
}

TEST_F(SessionProcess, BeginsWithTheDatabaseThatTheAgentMigrates) {
    SQLite::gDatabase->open(file().c_str(), true);
    OldSchema::make(10005);
    SQLite::gDatabase->close(true);
    ClientCore::openClientSession();
    EXPECT_EQ(agent.codes, std::vector<int>{17});
    EXPECT_EQ(version(), 10022);
}

TEST_F(SessionProcess, BeginsWithTheDatabaseThatTheAgentMakesOfABrokenOne) {
    base.writeFile("Orvane/Database/Database.sqlite3", std::string(8192, 'x'));
    ClientCore::openClientSession();
    EXPECT_EQ(agent.codes, std::vector<int>{26});
    EXPECT_EQ(version(), 10022);
}

TEST_F(SessionProcess, LearnsWhatTheAgentSubscribesTo) {
    ClientCore::openClientSession();
    const Ref<ClientCore> client = newClient();
    const Ref<URL> url = URL::url(String::string("http://example.org/feed"));
    EXPECT_EQ(static_cast<SubscriptionCore*>(client->getSubscription(url)), nullptr);
    agent.run({"subscribe", "http://example.org/feed"});
    const Ref<SubscriptionCore> made = client->getSubscription(url);
    ASSERT_NE(made.get(), nullptr);
    EXPECT_TRUE(IsEqual(made->getFeed()->mURL.getValue(), url.get()));
    client->prefetchFeeds();
    EXPECT_EQ(SQLite::TableOf<FeedCore>::instance()->getCachedRowCount(), 1u);
}

TEST_F(SessionProcess, GoesOnWithTheDatabaseThatReplacesItsOwn) {
    ClientCore::openClientSession();
    newClient();
    agent.run({"subscribe", "http://example.org/feed"});
    agent.run({"replace", "", "client", "second"});
    const Ref<String> second = String::string("second");
    // The file that was open has no more than it had.
    EXPECT_EQ(find(second), nullptr);
    ASSERT_TRUE(turnUntil([&] { return find(second) != nullptr; }));
    EXPECT_TRUE(ClientCore::getRow(1)->getSubscriptions("feed != 0").hasRow());
    EXPECT_EQ(agent.codes, std::vector<int>{12});
}

TEST_F(SessionProcess, HasTheAgentLookAtWhatBreaksLater) {
    ClientCore::openClientSession();
    newClient();
    try {
        SQLite::gDatabase->_throwQueryException(SQLite::Exception(11, "torn"));
    } catch (const SQLite::Exception& exception) {
        EXPECT_EQ(exception.getCode(), 11);
    }
    ASSERT_TRUE(turnUntil([&] { return agent.codes.size() == 2; }));
    EXPECT_EQ(agent.codes, (std::vector<int>{12, 11}));
    EXPECT_EQ(ClientCore::getRow(1)->mSignature.getValue()->utf8(), "org.example.Reader");
}
