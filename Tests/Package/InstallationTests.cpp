// What "cmake --install" puts where.

#include "Package/Installation.h"

#include <gtest/gtest.h>

#include <set>

namespace fs = std::filesystem;

namespace {

const std::string kLibraries = ORVANE_LIBDIR;

/// The installed system, once for all that only look at it.
const Installation& installed() {
    static const Installation sInstallation;
    return sInstallation;
}

std::set<std::string> namesIn(const fs::path& folder) {
    std::set<std::string> names;
    for (const fs::directory_entry& each : fs::directory_iterator(folder)) {
        names.insert(each.path().filename());
    }
    return names;
}

bool isText(const std::string& path) {
    return !path.ends_with(".mo") && path.find(".so") == std::string::npos &&
           path.find("bin/") == std::string::npos && path.find("libexec/") == std::string::npos;
}

}  // namespace

TEST(Installation, HasWhatRuns) {
    for (const char* program :
         {"bin/orvane", "libexec/orvane/orvane-agent", "libexec/orvane/orvane-tidy"}) {
        EXPECT_EQ(fs::status(installed() / program).permissions() & fs::perms::owner_exec,
                  fs::perms::owner_exec)
            << program;
    }
    for (const char* file :
         {"lib/systemd/user/orvane-agent.service", "lib/systemd/user/orvane-agent.socket",
          "share/dbus-1/services/com.tarnwick.orvane.ipc.service",
          "share/dbus-1/interfaces/com.tarnwick.orvane.ipc.xml",
          "share/locale/de/LC_MESSAGES/orvane.mo"}) {
        EXPECT_TRUE(fs::is_regular_file(installed() / file)) << file;
    }
    EXPECT_EQ(Installation::contentOf(installed() /
                                      "share/dbus-1/interfaces/com.tarnwick.orvane.ipc.xml"),
              Installation::contentOf(ORVANE_SOURCE "/Packaging/com.tarnwick.orvane.ipc.xml"));
}

TEST(Installation, HasThePublicHeadersAndNoOther) {
    EXPECT_EQ(namesIn(installed() / "include"), std::set<std::string>{"Orvane"});
    EXPECT_EQ(namesIn(installed() / "include/Orvane"), namesIn(ORVANE_SOURCE "/Include/Orvane"));
}

TEST(Installation, HasALibraryWithAStableName) {
    const std::string library = kLibraries + "/liborvane.so.1";
    EXPECT_EQ(fs::read_symlink(installed() / (kLibraries + "/liborvane.so")), "liborvane.so.1");
    EXPECT_EQ(fs::read_symlink(installed() / library), "liborvane.so.1." ORVANE_VERSION);
    const std::string dynamic = shell("readelf -dW '" + (installed() / library).string() + "'").out;
    EXPECT_NE(dynamic.find("Library soname: [liborvane.so.1]"), std::string::npos) << dynamic;
    EXPECT_EQ(dynamic.find("RUNPATH"), std::string::npos) << dynamic;
    const std::string names = shell("nm -D --defined-only --with-symbol-versions '" +
                                    (installed() / library).string() + "'")
                                  .out;
    EXPECT_NE(names.find(" OVAgentFrameworkMain@@ORVANE_1\n"), std::string::npos);
}

TEST(Installation, HasNoLibraryButThatOfApplications) {
    for (const std::string& file : installed().getFiles()) {
        EXPECT_FALSE(file.ends_with(".a")) << file;
        if (file.ends_with(".so") || file.find(".so.") != std::string::npos) {
            EXPECT_TRUE(file.starts_with(kLibraries + "/liborvane.so")) << file;
        }
    }
}

TEST(Installation, HasProgramsThatFindTheirLibraryAndFiles) {
    const std::string help = shell("'" + (installed() / "bin/orvane").string() + "' --help").out;
    EXPECT_NE(help.find("inspect"), std::string::npos) << help;
    for (const char* program : {"bin/orvane", "libexec/orvane/orvane-agent"}) {
        const std::string needed =
            shell("LD_LIBRARY_PATH= ldd '" + (installed() / program).string() + "'").out;
        EXPECT_NE(needed.find("liborvane.so.1 => " + installed().getTop().string()),
                  std::string::npos)
            << needed;
    }
}

TEST(Installation, NamesTheAgentUnderItsPrefix) {
    const std::string agent = installed() / "libexec/orvane/orvane-agent";
    const std::string bus = Installation::contentOf(
        installed() / "share/dbus-1/services/com.tarnwick.orvane.ipc.service");
    EXPECT_NE(bus.find("\nExec=" + agent + "\n"), std::string::npos) << bus;
    const std::string unit =
        Installation::contentOf(installed() / "lib/systemd/user/orvane-agent.service");
    EXPECT_NE(unit.find("\nExecStart=" + agent + "\n"), std::string::npos) << unit;
}

TEST(Installation, CanBeStagedForAnotherPlace) {
    const Installation staged("/opt/orvane");
    EXPECT_EQ(staged.getFiles(), installed().getFiles());
    const std::string bus =
        Installation::contentOf(staged / "share/dbus-1/services/com.tarnwick.orvane.ipc.service");
    EXPECT_NE(bus.find("\nExec=/opt/orvane/libexec/orvane/orvane-agent\n"), std::string::npos)
        << bus;
    for (const std::string& file : staged.getFiles()) {
        if (!isText(file)) continue;
        const std::string content = Installation::contentOf(staged / file);
        for (const std::string& foreign :
             {staged.getFolder().path().string(), std::string(ORVANE_BUILD "/"),
              std::string(ORVANE_SOURCE "/")}) {
            EXPECT_EQ(content.find(foreign), std::string::npos) << file << " names " << foreign;
        }
    }
}
