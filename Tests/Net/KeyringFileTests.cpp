#include "Foundation/AutoreleasePool.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"
#include "Net/KeyringCredentialStore.h"
#include "Support/EnvVar.h"
#include "Support/TempDir.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>

#include <optional>
#include <string>

using namespace Foundation;
using namespace Orvane;

#ifdef __SANITIZE_ADDRESS__
/// libsecret forgets the tag of its file at every save.
extern "C" [[gnu::visibility("default")]] const char*
__asan_default_options() {  // NOLINT: its name
    return "detect_leaks=0";
}
#endif

namespace {

/// The keyring that libsecret keeps in a file.
class KeyringFileTest : public testing::Test {
 protected:
    KeyringFileTest()
        : mBackend("SECRET_BACKEND", "file"),
          mPath("SECRET_FILE_TEST_PATH", (sFiles() / "keyring").c_str()),
          mPassword("SECRET_FILE_TEST_PASSWORD", "words") {}
    ~KeyringFileTest() noexcept override = default;

    static URL* url(const char* text) { return URL::url(String::string(text)); }
    static String* string(const char* text) { return String::string(text); }
    /// "none" if there is none.
    std::string find(const char* address, const char* user) {
        std::optional<std::string> found;
        store.findInternetPassword(url(address), string(user), [&](String* password) {
            found = password ? password->utf8() : "none";
        });
        return Support::turnUntil([&] { return found.has_value(); }) ? *found : "no answer";
    }
    bool becomes(const char* address, const char* user, const std::string& password) {
        return Support::turnUntil([&] { return find(address, user) == password; });
    }

    AutoreleasePool pool;
    KeyringCredentialStore store;

 private:
    /// The library keeps to the first file that it has seen.
    static const Support::TempDir& sFiles() {
        static const Support::TempDir sDirectory;
        return sDirectory;
    }

    Support::EnvVar mBackend, mPath, mPassword;
};

}  // namespace

TEST_F(KeyringFileTest, FindsWhatItKeeps) {
    EXPECT_EQ(find("http://example.org/feed", "ann"), "none");
    EXPECT_EQ(store.saveInternetPassword(url("http://example.org/feed"), string("ann"),
                                         string("ge\xC3\xB6"
                                                "ffnet")),
              NetError::None);
    EXPECT_TRUE(becomes("http://example.org/feed", "ann",
                        "ge\xC3\xB6"
                        "ffnet"));
    store.saveInternetPassword(url("http://example.org/feed"), string("ann"), string("new"));
    EXPECT_TRUE(becomes("http://example.org/feed", "ann", "new"));
    store.saveInternetPassword(url("http://example.org/feed"), string("ann"), nullptr);
    EXPECT_TRUE(becomes("http://example.org/feed", "ann", "none"));
}

TEST_F(KeyringFileTest, KeepsThemForUserSchemeHostAndPort) {
    store.saveInternetPassword(url("https://Example.org/feed"), string("ann"), string("secret"));
    ASSERT_TRUE(becomes("https://example.org:443/other", "ann", "secret"));
    EXPECT_EQ(find("http://example.org/feed", "ann"), "none");
    EXPECT_EQ(find("https://example.org:8443/feed", "ann"), "none");
    EXPECT_EQ(find("https://www.example.org/feed", "ann"), "none");
    EXPECT_EQ(find("https://example.org/feed", "bob"), "none");
}

TEST_F(KeyringFileTest, KeepsNoneForNoServer) {
    EXPECT_EQ(store.saveInternetPassword(url("file:///feed"), string("ann"), string("secret")),
              NetError(NetError::kPFURL, -1000));
    EXPECT_EQ(store.saveInternetPassword(nullptr, string("ann"), string("secret")),
              NetError(NetError::kPFURL, -1000));
    EXPECT_EQ(find("file:///feed", "ann"), "none");
}
