#include "Foundation/ProxySettings.h"

#include "Support/EnvVar.h"
#include "Support/LogCapture.h"
#include "Support/TempDir.h"
#include "Support/TurnUntil.h"

#include <gio/gio.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <stdexcept>

using namespace Foundation;
using Support::LogCapture;
using Support::TempDir;
using Support::turnUntil;

namespace {

constexpr const char* kSchema = "com.tarnwick.test.proxy";

std::string protocolSchema(const std::string& name) {
    return "<schema id='com.tarnwick.test.proxy." + name + "' path='/test/proxy/" + name +
           "/'>"
           "<key name='host' type='s'><default>''</default></key>"
           "<key name='port' type='i'><default>0</default></key>"
           "</schema>";
}

/// Settings of the same form as the desktop's, in memory, so that the tests need no desktop. Which
/// ones are installed is read once in a process, so this comes before every test.
class TestSettings : public testing::Environment {
    void SetUp() override {
        folder.writeFile("test.gschema.xml",
                         "<schemalist>"
                         "<schema id='com.tarnwick.test.proxy' path='/test/proxy/'>"
                         "<key name='mode' type='s'><default>'none'</default></key>"
                         "<key name='autoconfig-url' type='s'><default>''</default></key>"
                         "<key name='ignore-hosts' type='as'><default>['localhost']</default>"
                         "</key></schema>" +
                             protocolSchema("http") + protocolSchema("https") +
                             protocolSchema("ftp") + protocolSchema("socks") + "</schemalist>");
        const std::string command = "glib-compile-schemas " + folder.path().string();
        ASSERT_EQ(std::system(command.c_str()), 0);
        setenv("GSETTINGS_SCHEMA_DIR", folder.path().c_str(), 1);
    }

    TempDir folder;
};

const testing::Environment* const sTestSettings =
    testing::AddGlobalTestEnvironment(new TestSettings);

class ProxySettingsTest : public testing::Test {
 protected:
    ~ProxySettingsTest() override {
        g_settings_reset(general, "mode");
        g_settings_reset(general, "autoconfig-url");
        g_settings_reset(http, "host");
        g_settings_reset(http, "port");
        g_object_unref(general);
        g_object_unref(http);
    }

    GSettings* general = g_settings_new(kSchema);
    GSettings* http = g_settings_new("com.tarnwick.test.proxy.http");
    int changes = 0;
    ProxySettings settings{[this] { ++changes; }, kSchema};
};

}  // namespace

TEST_F(ProxySettingsTest, DescribesWhatCounts) {
    EXPECT_EQ(settings.describe(), "none");
    g_settings_set_string(general, "autoconfig-url", "http://192.0.2.1/proxy.pac");
    EXPECT_EQ(settings.describe(), "none");
    g_settings_set_string(general, "mode", "auto");
    EXPECT_EQ(settings.describe(), "auto 'http://192.0.2.1/proxy.pac'");
    g_settings_set_string(http, "host", "proxy.example.org");
    g_settings_set_int(http, "port", 3128);
    EXPECT_EQ(settings.describe(), "auto 'http://192.0.2.1/proxy.pac'");
    g_settings_set_string(general, "mode", "manual");
    EXPECT_EQ(settings.describe(),
              "manual http='proxy.example.org':3128 https='':0 ftp='':0 socks='':0 except "
              "['localhost']");
}

TEST_F(ProxySettingsTest, TellsOfChangesOfModeAndHost) {
    settings.describe();
    g_settings_set_string(general, "mode", "manual");
    EXPECT_TRUE(turnUntil([&] { return changes > 0; }));
    changes = 0;
    g_settings_set_string(http, "host", "proxy.example.org");
    EXPECT_TRUE(turnUntil([&] { return changes > 0; }));
}

TEST_F(ProxySettingsTest, ReportsWhatTheHandlerThrows) {
    LogCapture log;
    ProxySettings other([] { throw std::runtime_error("no good"); }, kSchema);
    other.describe();
    g_settings_set_string(general, "mode", "manual");
    EXPECT_TRUE(turnUntil([&] { return log.contains("\"no good\" caught in"); }));
}

TEST_F(ProxySettingsTest, WhereTheSettingsAreNotInstalledThereAreNone) {
    const ProxySettings none([] {}, "com.tarnwick.test.missing");
    EXPECT_EQ(none.describe(), std::nullopt);
}
