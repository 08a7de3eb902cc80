#include "Model/ClientSession.h"

#include "Foundation/DictionaryOf.h"
#include "Foundation/Logger.h"
#include "Foundation/NotificationCenter.h"
#include "Model/ClientCore.h"
#include "Model/StorageTest.h"
#include "Model/UnreachableAgent.h"
#include "SQLite/Exception.h"

#include <fstream>
#include <functional>

using namespace Foundation;
using namespace Orvane;
using Support::LoggingOn;
using Codes = std::vector<int>;
namespace fs = std::filesystem;

namespace {

/// An agent that repairs the database as the test says. It is the link of the process.
class RepairingAgent : public UnreachableAgent {
 public:
    RepairingAgent() { setCurrent(this); }
    ~RepairingAgent() override { setCurrent(nullptr); }
    void fixDatabase(int code) override {
        codes.push_back(code);
        EXPECT_FALSE(SQLite::gDatabase->isOpen());
        if (!repair) return UnreachableAgent::fixDatabase(code);
        repair();
    }

    Codes codes;
    std::function<void()> repair;
};

class ClientSessionTest : public StorageTest {
 protected:
    ClientSessionTest() {
        fs::create_directories(file().parent_path());
        agent.repair = [this] { makeCurrent(); };
    }

    fs::path file() const { return storage() / "Database/Database.sqlite3"; }
    /// Makes a new database in place of what is there.
    void makeCurrent() const {
        fs::remove(file());
        db().open(file().c_str(), true);
        Schema::createDatabase();
        db().execute("insert into Clients (rowID,signature) values (1,'a')");
        db().close(true);
    }
    void makeVersion(int version) const {
        makeCurrent();
        db().open(file().c_str(), true);
        db().setUserVersion(version);
        db().close(true);
    }
    /// Opens the session. Whether that is possible.
    bool open() {
        log.clear();
        try {
            ClientCore::openClientSession();
            return true;
        } catch (const std::exception& exception) {
            EXPECT_EQ(typeid(exception), typeid(std::exception));
            EXPECT_FALSE(db().isOpen());
            return false;
        }
    }
    /// As if a query had failed with a fatal error; it is told in the loop's next turn.
    void fail() {
        EXPECT_THROW(db()._throwQueryException(SQLite::Exception(11, "torn")), SQLite::Exception);
        clock.advanceBy(0);
    }
    void replace() { platform.deliver("com.tarnwick.orvane.DBReplaced", "Orvane Agent", nullptr); }
    bool isOpenForReading() const {
        return db().isOpen() && !db().isWriteable() && count("Clients") == 1;
    }

    LoggingOn logging{{}};
    RepairingAgent agent;
};

}  // namespace

TEST_F(ClientSessionTest, OpensForReading) {
    makeCurrent();
    EXPECT_TRUE(open());
    EXPECT_TRUE(isOpenForReading());
    EXPECT_EQ(agent.codes, Codes{});
    EXPECT_EQ(log.count("***** Opening client Orvane session *****"), 1);
    EXPECT_EQ(log.count("Client session is open for business!"), 1);
}

TEST_F(ClientSessionTest, LeavesADatabaseThatIsOpen) {
    makeCurrent();
    db().open(file().c_str(), true);
    EXPECT_TRUE(open());
    EXPECT_TRUE(db().isWriteable());
    EXPECT_FALSE(log.contains("session"));
}

TEST_F(ClientSessionTest, HasTheAgentMakeADatabaseThatIsMissing) {
    EXPECT_TRUE(open());
    EXPECT_TRUE(isOpenForReading());
    EXPECT_EQ(agent.codes, Codes{12});
    EXPECT_EQ(log.count("***** Database file doesn't exist ... starting agent ..."), 1);
}

TEST_F(ClientSessionTest, HasTheAgentMigrateADatabaseThatIsOld) {
    makeVersion(10021);
    EXPECT_TRUE(open());
    EXPECT_TRUE(isOpenForReading());
    EXPECT_EQ(db().getUserVersion(), 10022);
    EXPECT_EQ(agent.codes, Codes{17});
    EXPECT_EQ(log.count("***** Database schema is outdated ... starting agent ..."), 1);
}

TEST_F(ClientSessionTest, ReadsADatabaseThatIsNewer) {
    makeVersion(10023);
    EXPECT_TRUE(open());
    EXPECT_EQ(agent.codes, Codes{});
}

TEST_F(ClientSessionTest, HasTheAgentMendADatabaseThatIsBroken) {
    writeFile("Database/Database.sqlite3", std::string(4096, 'x'));
    EXPECT_TRUE(open());
    EXPECT_TRUE(isOpenForReading());
    EXPECT_EQ(agent.codes, Codes{26});
    EXPECT_EQ(log.count("***** SQL error opening database: SQLITE_NOTADB[26.0]: "), 1);
}

TEST_F(ClientSessionTest, AsksOnceMoreIfWhatTheAgentDidCannotBeOpened) {
    makeVersion(10021);
    agent.repair = [this] {
        fs::remove(file());
        if (agent.codes.size() == 2) makeCurrent();
    };
    EXPECT_TRUE(open());
    EXPECT_EQ(agent.codes, (Codes{17, 14}));
}

TEST_F(ClientSessionTest, IsNotOpenWithoutAnAgentToMakeTheDatabase) {
    agent.repair = nullptr;
    EXPECT_FALSE(open());
    EXPECT_EQ(log.count("static void Orvane::ClientCore::openClientSession()"), 1);
    EXPECT_FALSE(log.contains("open for business"));
    // A later call tries again.
    agent.repair = [this] { makeCurrent(); };
    EXPECT_TRUE(open());
}

TEST_F(ClientSessionTest, IsNotOpenIfTheAgentMadeNothing) {
    agent.repair = [] {};
    EXPECT_FALSE(open());
    EXPECT_EQ(agent.codes, (Codes{12, 14}));
}

TEST_F(ClientSessionTest, HasTheAgentMendWhatBreaksLater) {
    makeCurrent();
    ASSERT_TRUE(open());
    fail();
    EXPECT_EQ(agent.codes, Codes{11});
    EXPECT_EQ(
        log.count("***** Asking agent to rebuild database: err=11, SQLITE_CORRUPT[11.0]: torn"), 1);
    EXPECT_TRUE(isOpenForReading());
    // Again, and once, after it was opened anew.
    db().close(true);
    ASSERT_TRUE(open());
    fail();
    EXPECT_EQ(agent.codes, (Codes{11, 11}));
}

TEST_F(ClientSessionTest, TakesAnErrorThatSaysNothingForMinusOne) {
    makeCurrent();
    ASSERT_TRUE(open());
    NotificationCenter::getLocal()->post(SQLite::Database::kDatabaseFatalErrorNotification, &db(),
                                         nullptr);
    EXPECT_EQ(agent.codes, Codes{-1});
    EXPECT_EQ(log.count("***** Asking agent to rebuild database: err=-1, (null)"), 1);
}

TEST_F(ClientSessionTest, LeavesTheErrorsOfOtherConnectionsAlone) {
    makeCurrent();
    ASSERT_TRUE(open());
    SQLite::Database other;
    NotificationCenter::getLocal()->post(SQLite::Database::kDatabaseFatalErrorNotification, &other,
                                         nullptr);
    EXPECT_EQ(agent.codes, Codes{});
}

TEST_F(ClientSessionTest, IsOpenedAgainByTheNextUseIfTheRepairFailed) {
    makeCurrent();
    ASSERT_TRUE(open());
    agent.repair = nullptr;
    fail();
    EXPECT_FALSE(db().isOpen());
    EXPECT_TRUE(open());
    EXPECT_TRUE(isOpenForReading());
}

TEST_F(ClientSessionTest, OpensTheFileThatReplacesItsOwn) {
    makeCurrent();
    ASSERT_TRUE(open());
    const Ref<ClientCore> client = ClientCore::getRow(1);
    // Another file of the same name, as the agent makes one.
    fs::rename(file(), storage() / "old");
    SQLite::Database maker;
    fs::copy(storage() / "old", file());
    maker.open(file().c_str(), true);
    maker.execute("update Clients set signature='b'");
    maker.close(true);
    EXPECT_EQ(client->mSignature.getValue()->utf8(), "a");
    replace();
    EXPECT_EQ(log.count("***** Database was replaced by agent ..."), 1);
    EXPECT_TRUE(isOpenForReading());
    EXPECT_EQ(ClientCore::getRow(1)->mSignature.getValue()->utf8(), "b");
}

// Where nobody turns the run loop, nothing is told.

TEST_F(ClientSessionTest, FollowsTheFileWhereNobodyTurnsTheLoop) {
    makeCurrent();
    ASSERT_TRUE(open());
    const std::uint32_t generation = db().getGeneration();
    fs::rename(file(), storage() / "old");
    ClientSession::catchUpIfUnturned();
    // There is nothing else to read yet.
    EXPECT_EQ(db().getGeneration(), generation);
    EXPECT_TRUE(isOpenForReading());
    fs::copy(storage() / "old", file());
    ClientSession::catchUpIfUnturned();
    EXPECT_NE(db().getGeneration(), generation);
    EXPECT_TRUE(isOpenForReading());
    EXPECT_EQ(log.count("***** Database was replaced, and nobody turns the run loop ..."), 1);
    ClientSession::catchUpIfUnturned();
    EXPECT_EQ(log.count("***** Database was replaced, and nobody turns the run loop ..."), 1);
    EXPECT_EQ(agent.codes, Codes{});
}

TEST_F(ClientSessionTest, WaitsForTheAgentThatStillMakesTheNewFile) {
    makeCurrent();
    ASSERT_TRUE(open());
    fs::rename(file(), storage() / "old");
    std::ofstream(file()).close();
    ClientSession::catchUpIfUnturned();
    EXPECT_EQ(agent.codes, Codes{17});
    EXPECT_TRUE(isOpenForReading());
}

TEST_F(ClientSessionTest, HasTheAgentMendAtTheNextUseWhatNobodyWasTold) {
    makeCurrent();
    ASSERT_TRUE(open());
    EXPECT_THROW(db()._throwQueryException(SQLite::Exception(11, "torn")), SQLite::Exception);
    ClientSession::catchUpIfUnturned();
    EXPECT_EQ(agent.codes, Codes{11});
    EXPECT_TRUE(isOpenForReading());
    // Who turns the loop later is not told once more.
    clock.advanceBy(0);
    EXPECT_EQ(agent.codes, Codes{11});
}

TEST_F(ClientSessionTest, TriesAgainAtTheNextUseWhatCouldNotBeMended) {
    makeCurrent();
    ASSERT_TRUE(open());
    agent.repair = nullptr;
    fail();
    EXPECT_FALSE(db().isOpen());
    ClientSession::catchUpIfUnturned();
    EXPECT_TRUE(isOpenForReading());
}
