#include "Model/ClientCore.h"

#include "Foundation/Logger.h"
#include "Foundation/NetException.h"
#include "Model/ClientTest.h"
#include "Support/AssertionOf.h"

using namespace Foundation;
using namespace Orvane;
using Support::assertionOf;
using Support::LoggingOn;
using Objects = std::vector<void*>;

namespace {

class ClientCoreTest : public ClientTest {};

struct Use {
    double age;    ///< of the last use, in seconds; below 0 for none
    bool isNoted;  ///< stored anew
    bool isNews;   ///< announced
    bool isAsked;  ///< told to the agent by a reader
};

class ClientUseTest : public ClientCoreTest, public testing::WithParamInterface<Use> {};

}  // namespace

TEST_F(ClientCoreTest, IsMadeInUseWithItsSettings) {
    const Ref<ClientCore> client = newClient();
    EXPECT_EQ(text(client->mSignature.getValue()), "org.example.Reader");
    EXPECT_EQ(time(client->mDateUsed), clock.now());
    EXPECT_EQ(count("Clients where signature='org.example.Reader' and dateUsed=788918400"), 1);
    EXPECT_EQ(count("Subscriptions where client=1 and feed=0 and refreshInterval=1800 and "
                    "expirationInterval=1209600 and maxEnclosureSize=8388608 and "
                    "refreshesInBackground=1 and downloadsEnclosures=0"),
              1);
    EXPECT_EQ(count("Subscriptions"), 1);
}

TEST_F(ClientCoreTest, IsTheOneThatThereIs) {
    const Ref<ClientCore> client = newClient();
    const LoggingOn on{{}};
    log.clear();
    EXPECT_EQ(newClient(), client.get());
    EXPECT_EQ(count("Clients"), 1);
    EXPECT_EQ(count("Subscriptions"), 1);
    EXPECT_EQ(log.count("existingClientWithSignature(\"org.example.Reader\") = "
                        "Orvane::ClientCore[Clients #1]"),
              1);
    EXPECT_EQ(static_cast<ClientCore*>(ClientCore::existingClientWithSignature(string("other"))),
              nullptr);
    EXPECT_EQ(log.count("existingClientWithSignature(\"other\") = (null)"), 1);
}

TEST_F(ClientCoreTest, NeedsASignature) {
    EXPECT_EQ(assertionOf([] { (void)ClientCore::createClient(nullptr); }), "sig");
}

TEST_F(ClientCoreTest, IsMadeByTheAgentForAReader) {
    newClient("there");
    becomeReader();
    ClientAgent agent;
    EXPECT_EQ(newClient("there")->getRowID(), 1);
    EXPECT_EQ(agent.calls, "");
    agent.onCall = [&] {
        writeElsewhere("insert into Clients (signature) values ('new')");
        agent.client = ClientCore::getRow(2);
    };
    const ClientCore* made = newClient("new");
    EXPECT_EQ(made, ClientCore::getRow(2));
    EXPECT_EQ(agent.calls, "createClient(new) ");
}

TEST_F(ClientCoreTest, IsNotMadeWithoutAnAgentForAReader) {
    becomeReader();
    EXPECT_THROW(newClient(), NetException);
}

TEST_P(ClientUseTest, IsNotedAsSeldomAsWillDo) {
    const Use& use = GetParam();
    const Ref<ClientCore> client = newClient();
    const double used = use.age < 0 ? 0 : clock.now() - use.age;
    client->mDateUsed.setValue(date(used));
    client->saveChanges();
    {
        const Schedule schedule;
        const LoggingOn on{{}};
        client->markInUse();
        EXPECT_EQ(time(client->mDateUsed), use.isNoted ? clock.now() : used);
        EXPECT_EQ(schedule.objects, use.isNews ? Objects{nullptr} : Objects{});
        EXPECT_EQ(log.contains(": Bumping dateUsed (was "), use.isNoted);
    }
    client->unload();
    becomeReader();
    ClientAgent agent;
    ClientCore::getRow(1)->markInUse();
    EXPECT_EQ(agent.calls, use.isAsked ? "markClientInUse(1) " : "");
}

TEST_F(ClientCoreTest, IsNotDormantByADateOfTheFutureAndDoesNotKeepIt) {
    const Ref<ClientCore> client = newClient();
    client->mDateUsed.setValue(date(clock.now() + kDay));
    client->markInUse();
    EXPECT_EQ(time(client->mDateUsed), clock.now() + kDay);
    client->mDateUsed.setValue(date(clock.now() + 1000 * kDay));
    EXPECT_FALSE(client->isDormant());
    client->markInUse();
    EXPECT_EQ(time(client->mDateUsed), clock.now());
}

INSTANTIATE_TEST_SUITE_P(
    Ages, ClientUseTest,
    testing::Values(Use{0, false, false, false}, Use{3599, false, false, false},
                    Use{3600, true, false, false}, Use{302399, true, false, false},
                    Use{302400, true, false, true}, Use{1209599, true, false, true},
                    Use{1209600, true, true, true}, Use{-1, true, true, true}));

TEST_F(ClientCoreTest, ReadsAnewWhenItWasUsedBehindACall) {
    newClient();
    becomeReader();
    ClientAgent agent;
    agent.onCall = [&] { writeElsewhere("update Clients set dateUsed=799999000"); };
    clock.jumpTo(800000000);
    const Ref<ClientCore> client = ClientCore::getRow(1);
    client->markInUse();
    client->markInUse();
    EXPECT_EQ(agent.calls, "markClientInUse(1) ");
    EXPECT_EQ(time(client->mDateUsed), 799999000);
}

TEST_F(ClientCoreTest, IsDormantAfterFourteenDays) {
    const Ref<ClientCore> client = newClient();
    EXPECT_FALSE(client->isDormant());
    client->mDateUsed.setValue(date(clock.now() - 14 * kDay + 1));
    EXPECT_FALSE(client->isDormant());
    client->mDateUsed.setValue(date(clock.now() - 14 * kDay));
    EXPECT_TRUE(client->isDormant());
    client->mDateUsed.setValue(nullptr);
    EXPECT_TRUE(client->isDormant());
}

TEST_F(ClientCoreTest, ThatIsDormantIsNotRefreshedUntilItIsUsedAgain) {
    const Ref<ClientCore> client = newClient();
    const Ref<SubscriptionCore> subscription = newSubscription(client, storedFeed());
    client->mDateUsed.setValue(date(clock.now() - 15 * kDay));
    EXPECT_EQ(subscription->getCurrentRefreshInterval(), FeedCore::kRefreshNever);
    const Schedule schedule;
    client->markInUse();
    EXPECT_EQ(subscription->getCurrentRefreshInterval(), 1800);
    EXPECT_EQ(schedule.notes.size(), 1u);
}

TEST_F(ClientCoreTest, RunsWhileItsApplicationDoes) {
    const Ref<ClientCore> client = newClient();
    EXPECT_FALSE(client->isProcessRunning());
    session.run("org.example.reader");
    EXPECT_TRUE(client->isProcessRunning());
    session.run("");
    EXPECT_FALSE(client->isProcessRunning());
}

TEST_F(ClientCoreTest, IsMadePrivateByTheAgentForAReader) {
    const Ref<ClientCore> client = newClient();
    client->public_setPrivate(true);
    EXPECT_TRUE(client->mPrivate);
    client->public_setPrivate(false);
    becomeReader();
    ClientAgent agent;
    agent.onCall = [&] { writeElsewhere("update Clients set private=1"); };
    const Ref<ClientCore> read = ClientCore::getRow(1);
    EXPECT_FALSE(read->mPrivate);
    read->public_setPrivate(true);
    EXPECT_EQ(agent.calls, "setPrivate(1,1) ");
    EXPECT_TRUE(read->mPrivate);
}
