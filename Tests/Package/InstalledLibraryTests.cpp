// Programs that are built against the installed library alone, and what they do.

#include "Foundation/Bus.h"
#include "Foundation/BusCenter.h"
#include "Package/Installation.h"
#include "Support/EnvVar.h"
#include "Support/PipedChild.h"
#include "Support/PrivateBus.h"
#include "Support/ScriptedServer.h"

#include <Orvane/OVClient.h>
#include <gtest/gtest.h>

#include <csignal>
#include <set>

using Support::EnvVar;
using Support::ServerAnswer;

namespace {

constexpr const char* kFeed =
    "<rss version='2.0'><channel><title>The feed</title>"
    "<item><guid>1</guid><title>One</title><description>first&lt;br>line</description></item>"
    "<item><guid>2</guid><title>Two</title><description>second</description></item>"
    "</channel></rss>";

/// Says in German that something is no regular expression, and how a long, broken document was
/// read: for that it needs the library's texts and its programs.
constexpr const char* kConsumer = R"(
#include <Orvane/Orvane.h>
#include <clocale>
#include <iostream>
int main() {
    std::setlocale(LC_ALL, "C.UTF-8");
    std::optional<OVError> error;
    OVRegularExpression::regularExpressionWithPattern("(", 0, &error);
    std::cout << error->description() << "\n";
    const OVDocument document = OVDocument::read("<rss><channel><title>T</title><description>" +
                                                 std::string(100000, 'x') + "</description><item>");
    std::cout << document.attempts << " " << document.feed->title.value_or("-") << "\n";
})";

/// Programs that run here find neither the build's files nor the source's.
class Surroundings {
    EnvVar mPrograms{"ORVANE_PROGRAMS", nullptr};
    EnvVar mResources{"ORVANE_RESOURCES", nullptr};
    EnvVar mIncludes{"CPLUS_INCLUDE_PATH", nullptr};
    EnvVar mLibraries{"LD_LIBRARY_PATH", nullptr};
};

/// The examples, built against an installed library, once for all tests.
struct BuiltExamples {
    Installation installation;
    std::string folder = installation.getFolder() / "examples";

    BuiltExamples() {
        const Surroundings alone;
        const std::string source = installation.getFolder() / "source";
        std::filesystem::copy(ORVANE_SOURCE "/Examples", source);
        shell(ORVANE_CMAKE " -S '" + source + "' -B '" + folder + "' -DCMAKE_PREFIX_PATH='" +
              installation.getTop().string() + "' -DCMAKE_CXX_COMPILER=" ORVANE_COMPILER);
        shell(ORVANE_CMAKE " --build '" + folder + "'");
    }
    std::string operator/(const std::string& program) const { return folder + "/" + program; }
};

const BuiltExamples& examples() {
    static const BuiltExamples sExamples;
    return sExamples;
}

/// A message bus that knows the installed agent, and a server of feeds.
class InstalledExamples : public testing::Test {
 protected:
    InstalledExamples() { server.answer("/feed", ServerAnswer().body(kFeed)); }
    ~InstalledExamples() override {
        const std::uint32_t agent =
            Foundation::Bus::user().getProcessID(Foundation::BusCenter::kAgentName);
        if (agent > 1) kill(static_cast<pid_t>(agent), SIGKILL);
    }

    Surroundings alone;
    EnvVar services{"XDG_DATA_DIRS", (examples().installation / "share").c_str()};
    Support::PrivateBus bus;
    Support::ScriptedServer server;
};

/// The next line that tells of an entry. How many lines say that all is told depends on how the
/// news come in: with the end of the refresh, or just behind it.
std::string nextEntry(Support::PipedChild& watch) {
    std::string line = watch.readLine();
    while (line.starts_with("done: ")) {
        line = watch.readLine();
    }
    return line;
}

}  // namespace

TEST(InstalledLibrary, IsFoundByPkgConfigWhereverItIsMovedTo) {
    Installation installation;
    installation.move();
    const Surroundings alone;
    const std::string libraries = installation / ORVANE_LIBDIR;
    const EnvVar path("PKG_CONFIG_PATH", (libraries + "/pkgconfig").c_str());
    EXPECT_EQ(shell("pkg-config --modversion orvane").out, ORVANE_VERSION "\n");
    const std::string source = installation.getFolder().writeFile("consumer.cpp", kConsumer);
    const std::string program = installation.getFolder() / "consumer";
    shell(ORVANE_COMPILER " -std=c++20 -Wall -Wextra -Werror '" + source + "' -o '" + program +
          "' $(pkg-config --cflags --libs orvane)");
    const EnvVar language("LANGUAGE", "de");
    EXPECT_EQ(shell("LD_LIBRARY_PATH='" + libraries + "' '" + program + "'").out,
              "Syntaxfehler in einem regul\xC3\xA4ren Ausdruck\n2 T\n");
}

TEST(InstalledLibrary, IsUsedAsTheReadmeSays) {
    const std::string readme = Installation::contentOf(ORVANE_SOURCE "/README.md");
    const std::string margin = "    ";
    std::string program;
    for (std::size_t i = readme.find(margin + "#include <Orvane/Orvane.h>"); i < readme.size();) {
        const std::string line = readme.substr(i, readme.find('\n', i) - i);
        if (!line.empty() && !line.starts_with(margin)) break;
        program += line + "\n";
        i += line.size() + 1;
    }
    EXPECT_NE(program.find("int main()"), std::string::npos) << program;
    const Surroundings alone;
    const EnvVar path("PKG_CONFIG_PATH",
                      (examples().installation / ORVANE_LIBDIR "/pkgconfig").c_str());
    const Support::TempDir folder;
    shell(ORVANE_COMPILER " -std=c++20 -Wall -Wextra -Werror '" +
          folder.writeFile("readme.cpp", program) + "' -o '" + (folder / "readme") +
          "' $(pkg-config --cflags --libs orvane)");
}

TEST(InstalledLibrary, IsFoundByCMakeInItsOwnVersionOnly) {
    const Surroundings alone;
    const Support::TempDir folder;
    const auto configure = [&](const std::string& version) {
        folder.writeFile("CMakeLists.txt",
                         "cmake_minimum_required(VERSION 3.16)\nproject(P NONE)\n"
                         "find_package(Orvane " +
                             version + " REQUIRED)\nfind_package(Orvane REQUIRED)\n");
        return Support::runChild(
            {ORVANE_CMAKE, "-S", folder.path(), "-B", folder / "build",
             "-DCMAKE_PREFIX_PATH=" + examples().installation.getTop().string()});
    };
    EXPECT_EQ(configure(ORVANE_VERSION).status, 0);
    const Support::ChildResult later = configure("99.0");
    EXPECT_NE(later.status, 0);
    EXPECT_NE(later.err.find("Could not find a configuration file for package \"Orvane\""),
              std::string::npos)
        << later.err;
}

TEST_F(InstalledExamples, FetchAFeedIntoMemory) {
    const Support::ChildResult fetched =
        Support::runChild({examples() / "fetch", server.url("/feed")});
    EXPECT_EQ(fetched.status, 0) << fetched.err;
    EXPECT_EQ(fetched.out, "The feed\n* One\n  first\n* Two\n  second\n") << fetched.err;
    const Support::ChildResult missing =
        Support::runChild({examples() / "fetch", server.url("/none")});
    EXPECT_EQ(missing.status, 1);
    EXPECT_NE(missing.err.find("(URL,-1100)"), std::string::npos) << missing.err;
    EXPECT_EQ(Support::runChild({examples() / "fetch", "mailto:a@example.org"}).status, 1);
    EXPECT_EQ(Support::runChild({examples() / "fetch", "no URL"}).status, 1);
    EXPECT_EQ(Support::runChild({examples() / "fetch"}).status, 2);
}

TEST_F(InstalledExamples, WatchAFeed) {
    // It ends by itself, should nothing ever come.
    Support::PipedChild watch({examples() / "watch", server.url("/feed"), "60"});
    // An entry may count as first seen a little before the client was made: that is no added one.
    std::set<std::string> titles;
    for (int i = 0; i < 2; ++i) {
        const std::string line = nextEntry(watch);
        EXPECT_TRUE(line.starts_with("added: ") || line.starts_with("updated: ")) << line;
        titles.insert(line.substr(line.find(' ') + 1));
    }
    EXPECT_EQ(titles, (std::set<std::string>{"One", "Two"}));
    EXPECT_EQ(watch.readLine(), "done: The feed, 2 unread");

    // Another application of the same user's changes what both have.
    const std::shared_ptr<OVClient> other = OVClient::applicationClient();
    ASSERT_TRUE(other);
    const std::shared_ptr<OVFeed> feed = other->addFeedWithURL(server.url("/feed"));
    ASSERT_TRUE(feed);
    const OVEntry::List entries = feed->entries();
    ASSERT_EQ(entries.size(), 2u);
    const std::string title = entries[0]->title().value_or("");
    entries[0]->setRead(true);
    EXPECT_EQ(nextEntry(watch), "read: " + title);
    EXPECT_EQ(watch.readLine(), "done: The feed, 1 unread");
    entries[0]->setFlagged(true);
    EXPECT_EQ(nextEntry(watch), "read: " + title + " (flagged)");
}

TEST_F(InstalledExamples, WatchForAsLongAsTheyAreTold) {
    const Support::ChildResult watched =
        Support::runChild({examples() / "watch", server.url("/feed"), "0"});
    EXPECT_EQ(watched.status, 0) << watched.err;
    EXPECT_EQ(watched.err.find("watch: "), std::string::npos) << watched.err;
    const Support::ChildResult refused =
        Support::runChild({examples() / "watch", "mailto:a@example.org"});
    EXPECT_EQ(refused.status, 1);
    EXPECT_NE(refused.err.find("watch: "), std::string::npos);
    EXPECT_EQ(Support::runChild({examples() / "watch"}).status, 2);
}
