#include "Foundation/ProxySettings.h"

#include "Foundation/Guard.h"

#include <gio/gio.h>

#include <algorithm>
#include <utility>

namespace Foundation {

namespace {

constexpr const char* kProtocols[] = {"http", "https", "ftp", "socks"};

/// To ask for settings that are not installed would end the process.
bool isInstalled(const std::string& schemaName) {
    GSettingsSchemaSource* source = g_settings_schema_source_get_default();
    GSettingsSchema* schema =
        source ? g_settings_schema_source_lookup(source, schemaName.c_str(), TRUE) : nullptr;
    if (!schema) return false;
    g_settings_schema_unref(schema);
    return true;
}

/// A setting's value as text, strings in quotes.
std::string textOf(GSettings* settings, const char* key) {
    GVariant* value = g_settings_get_value(settings, key);
    char* text = g_variant_print(value, FALSE);
    std::string result = text;
    g_free(text);
    g_variant_unref(value);
    return result;
}

void settingsChanged(GSettings*, const char*, gpointer handler) {
    callGuarded("void Foundation::settingsChanged(GSettings *, const char *, gpointer)",
                [&] { (*static_cast<std::function<void()>*>(handler))(); });
}

}  // namespace

ProxySettings::ProxySettings(std::function<void()> handler, const std::string& schema)
    : mHandler(std::move(handler)) {
    std::vector<std::string> names = {schema};
    for (const char* protocol : kProtocols) {
        names.push_back(schema + "." + protocol);
    }
    if (!std::ranges::all_of(names, isInstalled)) return;
    for (const std::string& name : names) {
        watch(g_settings_new(name.c_str()));
    }
}

ProxySettings::~ProxySettings() {
    for (GSettings* settings : mSettings) {
        g_signal_handlers_disconnect_by_data(settings, &mHandler);
        g_object_unref(settings);
    }
}

void ProxySettings::watch(GSettings* settings) {
    g_signal_connect(settings, "changed", G_CALLBACK(settingsChanged), &mHandler);
    mSettings.push_back(settings);
}

std::optional<std::string> ProxySettings::describe() const {
    if (mSettings.empty()) return std::nullopt;
    GSettings* general = mSettings.front();
    // Every setting is read each time, whichever counts: only of those that have been read since
    // the handler was connected is a change sure to be told.
    const std::string mode = textOf(general, "mode");
    const std::string script = textOf(general, "autoconfig-url");
    std::string manual = "manual";
    for (std::size_t i = 1; i < mSettings.size(); ++i) {
        manual.append(" ").append(kProtocols[i - 1]).append("=");
        manual.append(textOf(mSettings[i], "host")).append(":");
        manual.append(textOf(mSettings[i], "port"));
    }
    manual.append(" except ").append(textOf(general, "ignore-hosts"));
    if (mode == "'manual'") return manual;
    return mode == "'auto'" ? "auto " + script : "none";
}

}  // namespace Foundation
