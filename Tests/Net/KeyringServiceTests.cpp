#include "Foundation/AutoreleasePool.h"
#include "Foundation/Bus.h"
#include "Foundation/RunLoop.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"
#include "Net/KeyringCredentialStore.h"
#include "Support/BackgroundProcess.h"
#include "Support/ChildProcess.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"
#include "Support/PrivateBus.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <memory>
#include <optional>
#include <string>
#include <utility>

using namespace Foundation;
using namespace Orvane;
using Support::turnUntil;

namespace {

/// The keyring of a desktop, on a bus of the program's own. The library keeps to the first bus that
/// it has seen, and so there is one for all tests, which are in order.
class KeyringServiceTest : public testing::Test {
 protected:
    static void SetUpTestSuite() {
        // The bus must not start a keyring by itself.
        const std::filesystem::path services =
            std::filesystem::path(std::getenv("XDG_DATA_HOME")) / "dbus-1/services";
        std::filesystem::create_directories(services);
        std::ofstream(services / "org.freedesktop.secrets.service")
            << "[D-BUS Service]\nName=org.freedesktop.secrets\nExec=/bin/false\n";
        sBus = new Support::PrivateBus;
    }
    static void TearDownTestSuite() {
        delete sKeyring;
        delete sBus;
    }
    ~KeyringServiceTest() noexcept override = default;

    static void startKeyring(bool unlocks = true) {
        // It reads the password of a new keyring from its input.
        sKeyring = new Support::BackgroundProcess(
            {"/bin/sh", "-c",
             "exec gnome-keyring-daemon --foreground " + std::string(unlocks ? "--unlock " : "") +
                 "--components=secrets >/dev/null 2>&1 <<E\nwords\nE\n"});
        ASSERT_TRUE(turnUntil([] { return isThere(); }));
    }
    static void endKeyring() {
        delete std::exchange(sKeyring, nullptr);
        ASSERT_TRUE(turnUntil([] { return !isThere(); }));
    }
    static bool isThere() { return !Bus::user().getNameOwner("org.freedesktop.secrets").empty(); }
    static URL* url() { return URL::url(String::string("https://example.org/feed")); }
    static String* string(const char* text) { return String::string(text); }
    void beginToFind() {
        found.reset();
        store.findInternetPassword(url(), string("ann"), [&](String* password) {
            found = password ? password->utf8() : "none";
        });
    }
    /// "none" if there is none.
    std::string find() {
        beginToFind();
        return turnUntil([&] { return found.has_value(); }) ? *found : "no answer";
    }

    static Support::PrivateBus* sBus;
    static Support::BackgroundProcess* sKeyring;

    AutoreleasePool pool;
    Support::ManualClock clock;
    Support::LogCapture log;
    KeyringCredentialStore store;
    std::optional<std::string> found;
};

Support::PrivateBus* KeyringServiceTest::sBus = nullptr;
Support::BackgroundProcess* KeyringServiceTest::sKeyring = nullptr;

}  // namespace

TEST_F(KeyringServiceTest, FindsAndKeepsNothingWhereThereIsNone) {
    EXPECT_EQ(find(), "none");
    EXPECT_EQ(log.count("No password from the keyring: "), 1);
    EXPECT_EQ(store.saveInternetPassword(url(), string("ann"), string("secret")), NetError::None);
    EXPECT_TRUE(turnUntil([&] { return log.contains("The keyring has not kept a password: "); }));
}

TEST_F(KeyringServiceTest, FindsWhatItKeeps) {
    startKeyring();
    EXPECT_EQ(find(), "none");
    store.saveInternetPassword(url(), string("ann"), string("secret"));
    EXPECT_TRUE(turnUntil([&] { return find() == "secret"; }));
    // Others find it by what is said of it.
    const Support::ChildResult other =
        Support::runChild({"/usr/bin/secret-tool", "lookup", "server", "example.org", "user", "ann",
                           "protocol", "https", "port", "443"});
    EXPECT_EQ(other.out, "secret");
}

TEST_F(KeyringServiceTest, IsNotWaitedForLong) {
    if (!sKeyring) startKeyring();
    sBus->pause();
    beginToFind();
    const AutoreleasePool inner;
    while (RunLoop::current().turn()) {
    }
    EXPECT_FALSE(found.has_value());
    clock.advanceBy(KeyringCredentialStore::kLookUpSeconds);
    EXPECT_EQ(found, "none");
    EXPECT_EQ(log.count("The keyring does not answer"), 1);
    sBus->resume();
    // What comes too late does no harm.
    EXPECT_NE(find(), "no answer");
}

TEST_F(KeyringServiceTest, AsksNobodyToUnlockIt) {
    if (!sKeyring) startKeyring();
    store.saveInternetPassword(url(), string("ann"), string("secret"));
    ASSERT_TRUE(turnUntil([&] { return find() == "secret"; }));
    endKeyring();
    startKeyring(false);
    EXPECT_EQ(find(), "none");
    EXPECT_FALSE(log.contains("does not answer"));
}

TEST_F(KeyringServiceTest, SurvivesTheEndOfTheBus) {
    find();
    sBus->die();
    EXPECT_EQ(find(), "none");
}
