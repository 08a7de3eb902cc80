#include "Agent/Client/IPCClient.h"

#include "Agent/Client/InClientCall.h"
#include "Agent/RPC/AgentFixture.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/Bus.h"
#include "Foundation/DictionaryOf.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/Number.h"
#include "Model/AuthorCore.h"
#include "Model/ClientCore.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "SQLite/Transaction.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <csignal>
#include <filesystem>
#include <memory>
#include <thread>

using namespace Foundation;
using namespace Orvane;
using Support::turnUntil;

namespace {

constexpr NetError kLaunch{1002, 202};
constexpr NetError kLost{1002, 203};

class IPCClientTest : public AgentFixture {
 protected:
    static EntryCore* entry(SQLite::RowID rowID) { return EntryCore::getRow(rowID); }
    static ClientCore* reader() { return ClientCore::getRow(1); }
    /// Has the bus know no program for the agent's name any more.
    void withoutService() const {
        std::filesystem::remove_all(base.path() / "dbus-1");
        Bus::user().callMethod({"org.freedesktop.DBus", "/org/freedesktop/DBus",
                                "org.freedesktop.DBus", "ReloadConfig"});
    }
};

/// Has the agent's name, and answers the first call with an error.
class Refuser {
 public:
    Refuser(const Support::PrivateBus& bus, const char* error) {
        std::string text;
        mConnection = BusConnection::open(bus.getAddress(), text);
        BusMessage request = mConnection->newCall({"org.freedesktop.DBus", "/org/freedesktop/DBus",
                                                   "org.freedesktop.DBus", "RequestName"});
        request.append(RPC::kServiceName).append(std::uint32_t{4});
        EXPECT_TRUE(mConnection->call(request, 30).isValid());
        mThread = std::thread([this, error] { refuse(error); });
    }
    ~Refuser() { mThread.join(); }
    Refuser(const Refuser&) = delete;
    Refuser& operator=(const Refuser&) = delete;

 private:
    void refuse(const char* error) const {
        using std::chrono::steady_clock;
        const auto end = steady_clock::now() + std::chrono::seconds(30);
        for (BusConnection::Messages messages; steady_clock::now() < end; messages.clear()) {
            mConnection->pump(1, messages);
            if (messages.empty() || !messages[0].isCall()) continue;
            BusConnection::replyError(messages[0], error, "refused");
            mConnection->flush(30, messages);
            return;
        }
    }

    std::unique_ptr<BusConnection> mConnection;
    std::thread mThread;
};

/// How often the death of an agent has been posted.
class Deaths {
 public:
    Deaths() {
        NotificationCenter::getLocal()->addObserver(&mReceiver,
                                                    IPCConnection::kAgentDiedNotification, nullptr);
    }
    ~Deaths() { NotificationCenter::getLocal()->removeObserver(&mReceiver); }
    int count = 0;

 private:
    void died(Notification* notification) {
        EXPECT_EQ(notification->object, nullptr);
        ++count;
    }
    MethodReceiver<Notification, Deaths> mReceiver{this, &Deaths::died};
};

/// Notes the time-out of calls whenever a line with a text is logged.
class TimeoutProbe : public LogSink {
 public:
    explicit TimeoutProbe(const char* text) : mText(text), mPrevious(setLogSink(this)) {}
    ~TimeoutProbe() override { setLogSink(mPrevious); }
    void write(const Logger&, std::string_view text) override {
        if (text.find(mText) != std::string_view::npos) seen = gOrvaneIPCTimeoutMS;
    }
    int seen = 0;

 private:
    const char* mText;
    LogSink* mPrevious;
};

}  // namespace

TEST_F(IPCClientTest, StartsTheAgentByItsFirstCall) {
    client().lookupServerPort();
    EXPECT_EQ(agent(), 0) << "a look-up waits for nothing";
    const Ref<String> socket = client().getSocketPath("Render");
    EXPECT_EQ(socket.get(), nullptr);
    EXPECT_GT(agent(), 0);
    EXPECT_THROW(Ref<String>(client().getSocketPath(nullptr)), AssertionFailure);
}

TEST_F(IPCClientTest, FindsTheNextAgentWhenOneHasGone) {
    openSession();
    EXPECT_TRUE(entry(1)->public_setRead(true));
    killAgent();
    log.clear();
    EXPECT_TRUE(entry(2)->public_setRead(true));
    EXPECT_EQ(log.count("is invalid; looking it up again..."), 1);
    EXPECT_TRUE(entry(1)->mRead);
    EXPECT_TRUE(entry(2)->mRead);
}

TEST_F(IPCClientTest, MakesTheDatabaseWhereThereIsNone) {
    std::filesystem::remove_all(std::filesystem::path(path).parent_path());
    openSession();
    EXPECT_GT(agent(), 0);
    EXPECT_EQ(SQLite::gDatabase->getUserVersion(), 10022);
    const Ref<ClientCore> made = ClientCore::createClient(string("org.example.First"));
    EXPECT_EQ(made->getRowID(), 1);
    EXPECT_FALSE(SQLite::gDatabase->isWriteable());
}

TEST_F(IPCClientTest, OpensADatabaseInOrderWithoutTheAgent) {
    openSession();
    EXPECT_EQ(reader()->mSignature.getValue()->utf8(), "org.example.Reader");
    EXPECT_EQ(agent(), 0);
}

TEST_F(IPCClientTest, ReadsBackWhatItHasChanged) {
    openSession();
    EXPECT_FALSE(entry(1)->mRead);
    EXPECT_FALSE(entry(1)->mFlagged);
    entry(1)->public_setRead(true);
    entry(1)->public_setFlagged(true);
    EXPECT_TRUE(entry(1)->mRead);
    EXPECT_TRUE(entry(1)->mFlagged);
    const Ref<ContentCore> content = Returner<ContentCore>::adopted(new ContentCore);
    content->mMIMEType.setValue(string("text/plain"));
    content->mData.setValue(Data::adopt("what it says"));
    entry(1)->setContent(content);
    ASSERT_NE(entry(1)->getContent(), nullptr);
    EXPECT_EQ(entry(1)->getContent()->getData()->view(), "what it says");
    entry(1)->setContent(nullptr);
    EXPECT_EQ(entry(1)->getContent(), nullptr);
    const Ref<AuthorCore> author = Returner<AuthorCore>::adopted(new AuthorCore);
    author->mName.setValue(string("Bob"));
    EXPECT_TRUE(entry(1)->public_setAuthor(author));
    EXPECT_EQ(entry(1)->getAuthor()->getRowID(), 2);
    entry(1)->getAuthor()->public_setContactBookUID(string("uid"));
    EXPECT_EQ(entry(1)->getAuthor()->mContactBookUID.getValue()->utf8(), "uid");
    EXPECT_TRUE(entry(1)->public_setAuthor(nullptr));
    EXPECT_EQ(entry(1)->getAuthor(), nullptr);
    FeedCore::getRow(1)->public_setLogin(string("ann"));
    EXPECT_EQ(FeedCore::getRow(1)->mLogin.getValue()->utf8(), "ann");
    reader()->public_setPrivate(true);
    EXPECT_TRUE(reader()->mPrivate);
}

TEST_F(IPCClientTest, SubscribesWithTheSettingsThatAreGiven) {
    openSession();
    const Ref<ClientCore> other = ClientCore::createClient(string("org.example.Other"));
    const Ref<MutableDictionary> settings = MutableDictionary::dictionary();
    settings->set("refreshInterval", Number::number(600.9));
    settings->set("expirationInterval", Number::number(-1));
    settings->set("refreshesInBackground", Number::number(true));
    settings->set("maxEnclosureSize", Number::number(1e6));
    settings->set("enclosureTypesString", string("audio/mpeg"));
    const Ref<SubscriptionCore> made =
        other->createSubscription(url("http://example.org/1"), settings.get());
    ASSERT_NE(made.get(), nullptr);
    EXPECT_EQ(made->mRefreshInterval, 600);
    EXPECT_EQ(made->mExpirationInterval, -1);
    EXPECT_TRUE(made->mRefreshesInBackground);
    EXPECT_FALSE(made->mDownloadsEnclosures);
    EXPECT_EQ(made->mMaxEnclosureSize, 1e6);
    EXPECT_EQ(made->mEnclosureTypesString.getValue()->utf8(), "audio/mpeg");
    made->setSettings(-7.9, 1e30, true, true, -1, nullptr);
    EXPECT_EQ(made->mRefreshInterval, -7);
    EXPECT_EQ(made->mMaxEnclosureSize, 0);
    EXPECT_EQ(made->mEnclosureTypesString.getValue(), nullptr);
    const Ref<SubscriptionCore> none =
        other->createSubscription(url("unheard-of:feed"), settings.get());
    EXPECT_EQ(none.get(), nullptr);
    client().deleteSubscription(made);
    EXPECT_EQ(inFile("select count(*) from Subscriptions where client=2"), 1);
}

TEST_F(IPCClientTest, AsksForFeedsAndEnclosures) {
    openSession();
    EXPECT_EQ(client().refresh(FeedCore::getRow(1), true), NetError::None);
    EXPECT_THROW(client().refresh(nullptr, true), AssertionFailure);
    const SQLite::RowID feeds[] = {1, 2};
    client().refreshMultiple(feeds, 2, false);
    EXPECT_THROW(client().refreshMultiple(nullptr, 1, false), AssertionFailure);
    client().recoverOldEntries(FeedCore::getRow(1));
    EXPECT_TRUE(client().enclosureAction(EnclosureCore::getRow(1), 7));
    EXPECT_FALSE(client().startSkerrySync());
    client().markClientInUse(reader());
    client().expireAllEntries(reader());
    EXPECT_EQ(inFile("select dateUsed > 1 from Clients where rowID=1"), 1);
}

TEST_F(IPCClientTest, SendsNothingForNoRows) {
    openSession();
    client().setFlags(nullptr, 0, 1, 1);
    client().refreshMultiple(nullptr, 0, true);
    EXPECT_EQ(agent(), 0);
    const SQLite::RowID rows[] = {1, 2};
    client().setFlags(rows, 2, 1, -1);
    EXPECT_EQ(inFile("select count(*) from Entries where read=1"), 2);
}

TEST_F(IPCClientTest, ThrowsWhatTheAgentAnswers) {
    openSession();
    const Ref<EntryCore> row = entry(5);
    SQLite::Database writer;
    writer.open(path.c_str(), true);
    writer.execute("delete from Entries where rowID=5");
    writer.close(true);
    EXPECT_EQ(errorOf([&] { row->public_setRead(true); }), NetError(1002, 200));
    EXPECT_TRUE(
        log.contains("IPC call returned OVInvalidRowIDError (1002,200) (Mach error f8fa80c8)"));
}

TEST_F(IPCClientTest, WarnsOfACallWithinATransactionAndMakesIt) {
    const Support::EnvVar withStack("OVPrintStack", "1");
    openSession();
    const Ref<EntryCore> row = entry(1);
    testing::internal::CaptureStderr();
    {
        const SQLite::Transaction transaction(false);
        EXPECT_TRUE(row->public_setRead(true));
    }
    const std::string stack = testing::internal::GetCapturedStderr();
    EXPECT_EQ(std::count(stack.begin(), stack.end(), '\n'), 11) << stack;
    EXPECT_TRUE(stack.ends_with("\t...more...\n"));
    EXPECT_EQ(log.count("*** DANGER: Calling agent while in db transaction -- likely to deadlock "
                        "***"),
              1);
    EXPECT_EQ(inFile("select read from Entries where rowID=1"), 1);
}

TEST_F(IPCClientTest, LogsItsCallsWithTheTimeThatTheyTook) {
    openSession();
    const Support::LoggingOn on({&gLogIPC});
    EXPECT_TRUE(entry(1)->public_setRead(true));
    EXPECT_TRUE(log.contains("[IPC] Calling ipc_entry_setRead, rowID=1"));
    EXPECT_TRUE(log.contains("...took 0."));
    log.clear();
    setProgram("/bin/false");
    killAgent();
    EXPECT_EQ(errorOf([&] { entry(1)->public_setRead(false); }), kLaunch);
    EXPECT_FALSE(log.contains("...took"));
    EXPECT_EQ(gLogIPC.mIndentation, 0u);
}

TEST_F(IPCClientTest, LogsWhereItFindsTheAgentAndThatThatDies) {
    const Support::LoggingOn on({&gLogIPC});
    client().startSkerrySync();
    log.clear();
    client().lookupServerPort();
    const std::uint32_t found = client().getServerPort();
    EXPECT_TRUE(log.contains("[IPC] Looking up the agent's Mach port"));
    EXPECT_TRUE(log.contains(OVFormat("[IPC] Got agent Mach port: %u", found)));
    killAgent();
    constexpr const char* kDied = "[IPC] Agent's Mach port died -- presumably Agent died too";
    ASSERT_TRUE(turnUntil([&] { return log.contains(kDied); }));
    log.clear();
    client().startSkerrySync();
    EXPECT_GT(client().getServerPort(), found) << "no port comes to mean another agent";
}

TEST_F(IPCClientTest, CallsEvenIfTheBusTellsOfNoDeath) {
    client();
    bus.die();
    Bus::user().close();
    RPC::AgentService::instance()._forget();
    bus.start("<limit name=\"max_match_rules_per_connection\">0</limit>");
    client().lookupServerPort();
    EXPECT_EQ(log.count("IPCClient: mach_port_request_notification returned server died (11,-308)"),
              1);
    client().startSkerrySync();
    killAgent();
    client().startSkerrySync();
    EXPECT_GT(agent(), 0);
}

TEST_F(IPCClientTest, IsMadeWhereThereIsNoAgentToBeHad) {
    struct Connection : IPCConnection {};
    withoutService();
    const Connection connection;
    EXPECT_EQ(connection.getServerPort(), 0u);
    EXPECT_EQ(log.count("caught in Orvane::IPCClient::IPCClient()"), 1);
}

TEST_F(IPCClientTest, CannotLaunchWhatTheServiceManagerRefuses) {
    client().lookupServerPort();
    // Where the bus has the service manager start the agent, it hands on what that says.
    Refuser manager(bus, "org.freedesktop.systemd1.UnitMasked");
    EXPECT_EQ(errorOf([] { client().startSkerrySync(); }), kLaunch);
}

TEST_F(IPCClientTest, GivesARepairTwoMinutesAndOthersHalfAMinute) {
    setProgram("/bin/false");
    const Support::LoggingOn on({&gLogIPC});
    {
        const TimeoutProbe probe("AgentService:");
        EXPECT_EQ(errorOf([&] { client().fixDatabase(11); }), kLaunch);
        EXPECT_EQ(probe.seen, 120000);
    }
    EXPECT_EQ(gOrvaneIPCTimeoutMS, 30000);
    const TimeoutProbe probe("AgentService:");
    EXPECT_EQ(errorOf([&] { client().startSkerrySync(); }), kLaunch);
    EXPECT_EQ(probe.seen, 30000);
}

TEST_F(IPCClientTest, CannotLaunchWhatNobodyKnows) {
    withoutService();
    EXPECT_EQ(errorOf([] { client().lookupServerPort(); }), kLaunch);
    EXPECT_EQ(client().getServerPort(), 0u);
    EXPECT_FALSE(client().listenForAgentDeath());
    EXPECT_EQ(errorOf([] { client().startSkerrySync(); }), kLaunch);
}

TEST_F(IPCClientTest, CannotLaunchAnythingWithoutABus) {
    client().startSkerrySync();
    const pid_t running = agent();
    bus.die();
    ASSERT_TRUE(turnUntil([] { return !Bus::user().isConnected(); }));
    EXPECT_EQ(errorOf([] { client().startSkerrySync(); }), kLaunch);
    kill(running, SIGKILL);
    bus.start();
}

TEST_F(IPCClientTest, EndsACallThatTakesTooLong) {
    client().startSkerrySync();
    const pid_t running = agent();
    kill(running, SIGSTOP);
    openSession();
    gOrvaneIPCTimeoutMS = 100;
    EXPECT_EQ(errorOf([] { client().markClientInUse(reader()); }),
              NetError(NetError::kMach, MachError::kReceiveTimedOut));
    gOrvaneIPCTimeoutMS = 30000;
    kill(running, SIGCONT);
    client().startSkerrySync();
    EXPECT_EQ(agent(), running);
}

TEST_F(IPCClientTest, TellsTheProcessWhenTheAgentDies) {
    openSession();
    const Deaths deaths;
    EXPECT_TRUE(client().listenForAgentDeath());
    EXPECT_TRUE(entry(1)->public_setRead(true));
    EXPECT_NE(client().getServerPort(), 0u);
    killAgent();
    ASSERT_TRUE(turnUntil([&] { return deaths.count > 0; }));
    EXPECT_EQ(client().getServerPort(), 0u);
    // What was read can be read on.
    EXPECT_FALSE(entry(2)->mRead);
    log.clear();
    EXPECT_TRUE(entry(2)->public_setRead(true));
    EXPECT_EQ(log.count("IPCClient: Server port 0 is invalid; looking it up again..."), 1);
    killAgent();
    ASSERT_TRUE(turnUntil([&] { return deaths.count > 1; }));
    EXPECT_EQ(deaths.count, 2);
}

TEST_F(IPCClientTest, TellsOfADeathThatACallHasFoundOut) {
    client().startSkerrySync();
    const Deaths deaths;
    killAgent();
    client().startSkerrySync();
    const std::uint32_t present = client().getServerPort();
    ASSERT_TRUE(turnUntil([&] { return deaths.count > 0; }));
    EXPECT_EQ(deaths.count, 1);
    EXPECT_EQ(client().getServerPort(), present) << "that of the agent which is there now";
    EXPECT_GT(agent(), 0);
}

TEST_F(IPCClientTest, TurnsTextsIntoBytes) {
    const String* none = nullptr;
    const URL* nowhere = nullptr;
    EXPECT_TRUE(IPCClient::miggify(none).empty());
    EXPECT_TRUE(IPCClient::miggify(nowhere).empty());
    const auto text = IPCClient::miggify(static_cast<const String*>(string("\xc3\xa4")));
    EXPECT_EQ(std::vector<std::uint8_t>(text.begin(), text.end()),
              (std::vector<std::uint8_t>{0xc3, 0xa4}));
    EXPECT_EQ(IPCClient::miggify(static_cast<const URL*>(url("http://e.org/"))).size(), 13u);
}

TEST_F(IPCClientTest, MakesOrvaneErrorsOfTheTransports) {
    const std::pair<std::int32_t, NetError> kStatuses[] = {
        {1102, kLaunch},
        {-303, kLost},
        {-304, kLost},
        {-308, kLost},
        {0x3ffffff, kLost},
        {0x4000000, NetError(11, 0x4000000)},
        {0x10004003, NetError(11, 0x10004003)},
        {kReadOnly, NetError(1002, 201)},
        {0xC002, NetError(1, 2)},
    };
    for (const auto& [status, error] : kStatuses) {
        const std::int32_t copy = status;
        EXPECT_EQ(errorOf([&] { client().check(copy); }), error) << status;
    }
    EXPECT_EQ(errorOf([] { client().check(0); }), NetError::None);
    EXPECT_FALSE(client().retry(0));
}
