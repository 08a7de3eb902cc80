#pragma once

#include "Foundation/UntypedPref.h"

#include <concepts>

/// The names of the preferences that the system reads and writes, with their defaults. Users and
/// other programs set them by these names, so none may change.

namespace Foundation {

/// A preference of type T: its key and what holds where the key has no value.
template <class T>
struct PreferenceKey {
    const char* name;
    T defaultValue;

    /// The value in `prefs`.
    T valueIn(Prefs& prefs) const requires std::same_as<T, bool> || std::same_as<T, double> {
        const UntypedPref pref(prefs, name);
        return pref.exists() ? static_cast<T>(pref) : defaultValue;
    }
};

/// The agent's own, in its application's domain (`Prefs::applicationPrefs()`).
namespace AgentPreferences {
/// Waits 30 seconds at the start.
inline constexpr PreferenceKey<bool> kPauseOnLaunch{"PauseOnLaunch", false};
/// The absolute time at which the last daily run ended.
inline constexpr PreferenceKey<double> kLastHygieneRun{"LastHygieneRun", 0.0};
/// Seconds from one daily run to the next.
inline constexpr PreferenceKey<double> kHygieneRunInterval{"HygieneRunInterval", 86400.0};
/// Seconds by which a daily run that is overdue is put off.
inline constexpr PreferenceKey<double> kHygieneBackoffInterval{"HygieneBackoffInterval", 240.0};
/// The older database has been taken over.
inline constexpr PreferenceKey<bool> kElderMigrationCompleted{"ElderMigrationCompleted", false};
/// The account's name on the online service; empty for none.
inline constexpr PreferenceKey<const char*> kHolmMember{"HolmMember", ""};
}  // namespace AgentPreferences

/// Read by `GetBoolPref`, so that the environment may set them too.
namespace Switches {
/// The log, and with a facility's name appended that facility.
inline constexpr PreferenceKey<bool> kLog{"OVLog", false};
inline constexpr PreferenceKey<bool> kEnableSync{"OVEnableSync", true};
}  // namespace Switches

/// What the desktop's sync service is told to do.
inline constexpr const char* kSkerrySyncDomain = "com.tarnwick.SkerrySync";
namespace SkerrySyncPreferences {
/// Automatic sync is wanted.
inline constexpr PreferenceKey<bool> kAutoSyncOn{"AutoSyncOn", false};
/// Sync with the server is enabled.
inline constexpr PreferenceKey<bool> kShouldSyncWithServer{"ShouldSyncWithServer", false};
/// A dictionary: the modes of each data class.
inline constexpr PreferenceKey<std::nullptr_t> kDataclassModes{"DataclassModes", nullptr};
}  // namespace SkerrySyncPreferences

/// The domain of `BriskoRSSPrefs`.
inline constexpr const char* kBriskoRSSDomain = "com.tarnwick.Brisko.RSS";

}  // namespace Foundation
