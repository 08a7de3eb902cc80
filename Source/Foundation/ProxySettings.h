#pragma once

#include "Foundation/Uncopyable.h"

#include <functional>
#include <optional>
#include <string>
#include <vector>

typedef struct _GSettings GSettings;

namespace Foundation {

/// The user's proxies as the desktop keeps them, in the settings "org.gnome.system.proxy". Where
/// these are not installed there are none. Proxies in the environment cannot change while a
/// process lives, so nothing here looks at them.
///
/// Served by the default mode of the run loop of the thread that made it.
class ProxySettings : Uncopyable {
 public:
    static constexpr const char* kSchema = "org.gnome.system.proxy";

    /// `handler` is called when a setting may have changed; it must not end the object. What it
    /// throws is reported. `schema` names the settings.
    explicit ProxySettings(std::function<void()> handler, const std::string& schema = kSchema);
    ~ProxySettings();

    /// What is set, for logs and comparison: "none", "auto …" or "manual …", without user names
    /// and passwords. Nothing if the settings are not installed.
    std::optional<std::string> describe() const;

 private:
    void watch(GSettings* settings);

    std::function<void()> mHandler;
    std::vector<GSettings*> mSettings;  ///< the general ones, then one for each protocol
};

}  // namespace Foundation
