#include "Bridges/FeedSettings.h"

#include "Bridges/PublicValues.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/DictionaryOf.h"
#include "Foundation/Number.h"
#include "Model/SubscriptionCore.h"

using namespace Foundation;

namespace Orvane {

namespace {

using SettingsDictionary = MutableDictionaryOf<String, PFRefCounted>;

OVFeedSettings::Types typesOf(const SubscriptionCore& subscription) {
    const Ref<ArrayOf<String>> types = subscription.getEnclosureTypes();
    if (!types.get()) return std::nullopt;
    std::vector<std::string> texts;
    for (const String* type : *types) {
        texts.push_back(type->utf8());
    }
    return texts;
}

}  // namespace

OVFeedSettings settingsOf(const SubscriptionCore* sub) {
    OV_ASSERT_AS(sub != nullptr, "sub");
    OVFeedSettings settings;
    settings.setRefreshInterval(sub->mRefreshInterval);
    settings.setExpirationInterval(sub->mExpirationInterval);
    settings.setRefreshesInBackground(sub->mRefreshesInBackground);
    settings.setDownloadsEnclosures(sub->mDownloadsEnclosures);
    settings.setMaxEnclosureSize(sub->mMaxEnclosureSize);
    settings.setEnclosureTypes(typesOf(*sub));
    return settings;
}

void applySettings(const OVFeedSettings& settings, SubscriptionCore& subscription) {
    const Ref<ArrayOf<String>> types = stringsOf(settings.enclosureTypes());
    subscription.setSettings(settings.refreshInterval(), settings.expirationInterval(),
                             settings.refreshesInBackground(), settings.downloadsEnclosures(),
                             settings.maxEnclosureSize(), types.get());
}

Ref<Dictionary> dictionaryOf(const std::optional<OVFeedSettings>& settings) {
    if (!settings) return nullptr;
    const Ref<SettingsDictionary> made = SettingsDictionary::dictionary();
    made->set("refreshInterval", Number::number(settings->refreshInterval()));
    made->set("expirationInterval", Number::number(settings->expirationInterval()));
    made->set("refreshesInBackground", Number::number(settings->refreshesInBackground()));
    made->set("downloadsEnclosures", Number::number(settings->downloadsEnclosures()));
    made->set("maxEnclosureSize", Number::number(settings->maxEnclosureSize()));
    // Deliberately not under the name by which the agent is told the types of a subscription: a new
    // one is born without any.
    const Ref<ArrayOf<String>> types = stringsOf(settings->enclosureTypes());
    if (types.get()) made->set("enclosureTypes", types.get());
    return Ref<Dictionary>(made.get());
}

}  // namespace Orvane
