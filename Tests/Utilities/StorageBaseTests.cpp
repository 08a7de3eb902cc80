#include "Foundation/AssertionFailure.h"
#include "Support/EnvVar.h"
#include "Utilities/FileSystem.h"

#include <gtest/gtest.h>
#include <pwd.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <string>

using namespace Foundation;
using Compatibility::FileSystem;

namespace {

constexpr uid_t kNobodysUser = 2147480001;

/// Prints the storage base that a user without variables has, or the assertion.
[[noreturn]] void printBase(uid_t user) {
    unsetenv("HOME");
    unsetenv("XDG_DATA_HOME");
    if (user != getuid() && setuid(user) != 0) std::_Exit(2);
    try {
        const Ref<URL> base = FileSystem::getStorageBaseURL();
        std::fprintf(stderr, "base %s\n", base->getFileSystemRepresentation().c_str());
        std::_Exit(0);
    } catch (const AssertionFailure& failure) {
        std::fprintf(stderr, "assertion %s\n", failure.what());
        std::_Exit(1);
    }
}

}  // namespace

TEST(StorageBase, IsInTheHomeOfTheUsersAccount) {
    const passwd* account = getpwuid(getuid());
    if (!account) GTEST_SKIP() << "this user has no account";
    EXPECT_EXIT(printBase(getuid()), testing::ExitedWithCode(0),
                "base " + std::string(account->pw_dir) + "/.local/share");
}

TEST(StorageBase, IsAssertedForAUserWithoutAHome) {
    if (getuid() != 0) GTEST_SKIP() << "only root can be another user";
    EXPECT_EXIT(printBase(kNobodysUser), testing::ExitedWithCode(1),
                "assertion Couldn't locate user's Library directory!");
}
