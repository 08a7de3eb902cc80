#include "Foundation/BriskoRSSPrefs.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/PreferenceKeys.h"
#include "Foundation/Prefs.h"
#include "Foundation/UntypedPref.h"

#include <cstddef>
#include <iterator>

namespace Foundation {

namespace {

constexpr const char* kKeyNames[] = {
    "RefreshInterval",
    "MaxDaysToKeep",
    "IntervalLastUpdated",
    "ArticlesPerPage",
    "Theme.TimeChanged",
    "Theme.ClickArticles",
    "Theme.ShowArticleIcons",
    "Theme.HighlightUnreadArticleHeaders",
    "Theme.OpenArticlesInWindows",
    "Theme.ShowFOAF",
    "Theme.UserParam.",
    "Theme.UserParam.Styles",
    "Theme.UserParam.BriskoPrefStyles",
    "FixedSubscriptionAutodownloadSettings",
    "FixedRefreshesInBackgroundSettings",
    "com.tarnwick.PreferenceSync.ExcludeSyncKeys",
};
static_assert(std::size(kKeyNames) ==
              static_cast<std::size_t>(BriskoRSSPref::PreferenceSyncExcludeSyncKeys) + 1);

}  // namespace

Prefs& BriskoRSSPrefs::prefs() {
    static auto* const sPrefs = new Prefs(kBriskoRSSDomain);
    return *sPrefs;
}

bool BriskoRSSPrefs::GetBool(BriskoRSSPref pref, bool defaultValue) {
    const UntypedPref value(prefs(), getKeyName(pref));
    return value.exists() ? static_cast<bool>(value) : defaultValue;
}

int BriskoRSSPrefs::GetInt(BriskoRSSPref pref, int defaultValue) {
    const UntypedPref value(prefs(), getKeyName(pref));
    return value.exists() ? static_cast<int>(value) : defaultValue;
}

StringReturner BriskoRSSPrefs::GetStringByName(String* key, String* defaultValue) {
    const UntypedPref value(prefs(), key);
    if (!value.exists()) return StringReturner::retained(defaultValue);
    return value;
}

Returner<Dictionary> BriskoRSSPrefs::GetDictionaryByName(String* key, Dictionary* defaultValue) {
    const UntypedPref value(prefs(), key);
    if (!value.exists()) return Returner<Dictionary>::retained(defaultValue);
    return value;
}

void BriskoRSSPrefs::SetDictionaryByName(String* key, Dictionary* value) {
    UntypedPref(prefs(), key) = value;
}

void BriskoRSSPrefs::Synchronize() {
    prefs().synchronize();
}

const char* BriskoRSSPrefs::getKeyName(BriskoRSSPref pref) {
    const auto index = static_cast<std::size_t>(pref);
    OV_ASSERT_AS(index < std::size(kKeyNames), "pref<16");
    return kKeyNames[index];
}

}  // namespace Foundation
