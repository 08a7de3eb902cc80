#pragma once

#include "Foundation/DictionaryOf.h"
#include "Foundation/String.h"

namespace Foundation {

class Prefs;

/// The preferences of the browser's own interface for feeds. Those that nothing here reads are
/// named all the same: templates may ask for any of them.
enum class BriskoRSSPref : unsigned {
    RefreshInterval,
    MaxDaysToKeep,
    IntervalLastUpdated,
    ArticlesPerPage,
    ThemeTimeChanged,
    ThemeClickArticles,
    ThemeShowArticleIcons,
    ThemeHighlightUnreadArticleHeaders,
    ThemeOpenArticlesInWindows,
    ThemeShowFOAF,
    ThemeUserParam,  ///< the prefix of the templates' parameters
    ThemeUserParamStyles,
    ThemeUserParamBriskoPrefStyles,
    FixedSubscriptionAutodownloadSettings,
    FixedRefreshesInBackgroundSettings,
    PreferenceSyncExcludeSyncKeys,
};

/// The preferences of the domain "com.tarnwick.Brisko.RSS". Main thread.
class BriskoRSSPrefs {
 public:
    BriskoRSSPrefs() = delete;

    /// The value if the key has one, else the default.
    static bool GetBool(BriskoRSSPref pref, bool defaultValue);
    static int GetInt(BriskoRSSPref pref, int defaultValue);
    static StringReturner GetStringByName(String* key, String* defaultValue);
    static Returner<Dictionary> GetDictionaryByName(String* key, Dictionary* defaultValue);
    /// Null removes the key.
    static void SetDictionaryByName(String* key, Dictionary* value);
    /// Writes what was changed here and takes over what others changed.
    static void Synchronize();

    /// The key's text. Throws `AssertionFailure` for a value of 16 or more.
    static const char* getKeyName(BriskoRSSPref pref);

 private:
    static Prefs& prefs();
};

// The same for callers that know functions only.
inline bool BriskoRSSPrefs_GetBool(BriskoRSSPref pref, bool defaultValue) {
    return BriskoRSSPrefs::GetBool(pref, defaultValue);
}
inline int BriskoRSSPrefs_GetInt(BriskoRSSPref pref, int defaultValue) {
    return BriskoRSSPrefs::GetInt(pref, defaultValue);
}
inline StringReturner BriskoRSSPrefs_GetStringByName(String* key, String* defaultValue) {
    return BriskoRSSPrefs::GetStringByName(key, defaultValue);
}
inline Returner<Dictionary> BriskoRSSPrefs_GetDictionaryByName(String* key,
                                                               Dictionary* defaultValue) {
    return BriskoRSSPrefs::GetDictionaryByName(key, defaultValue);
}
inline void BriskoRSSPrefs_SetDictionaryByName(String* key, Dictionary* value) {
    BriskoRSSPrefs::SetDictionaryByName(key, value);
}
inline void BriskoRSSPrefs_Synchronize() {
    BriskoRSSPrefs::Synchronize();
}

}  // namespace Foundation
