#include "Support/TempDir.h"

#include <gtest/gtest.h>

#include <cstdlib>

namespace {

/// What CTest is told to take for "skipped". A suite in which one case was skipped counts as
/// skipped, so that none goes unseen; one with a failure never does.
constexpr int kSkipped = 77;

}  // namespace

/// Every test program runs in folders and with settings of its own, never the user's.
int main(int argc, char** argv) {
    testing::InitGoogleTest(&argc, argv);
    const Support::TempDir home;
    for (const char* name :
         {"HOME", "XDG_DATA_HOME", "XDG_CONFIG_HOME", "XDG_CACHE_HOME", "XDG_RUNTIME_DIR"}) {
        setenv(name, home.makeDirectory(name).c_str(), 1);
    }
    setenv("ORVANE_PROGRAMS", ORVANE_BUILT_PROGRAMS, 1);
    setenv("ORVANE_RESOURCES", ORVANE_BUILT_RESOURCES, 1);
    setenv("TZ", "UTC", 1);
    setenv("OVUseSystemLog", "0", 1);
    for (const char* name : {"DBUS_SESSION_BUS_ADDRESS", "LANGUAGE", "OVLog"}) {
        unsetenv(name);
    }
    setenv("LC_ALL", "C", 1);
    setenv("GSETTINGS_BACKEND", "memory", 1);
    const int result = RUN_ALL_TESTS();
    const bool skippedAny = testing::UnitTest::GetInstance()->skipped_test_count() > 0;
    return result == 0 && skippedAny ? kSkipped : result;
}
