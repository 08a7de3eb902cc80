#pragma once

#include "Foundation/Ref.h"

#include <Orvane/OVFeedSettings.h>

#include <optional>

namespace Foundation {
class Dictionary;
}

namespace Orvane {

class SubscriptionCore;

/// Between subscriptions and the settings that applications see.

/// Throws `AssertionFailure` for null.
OVFeedSettings settingsOf(const SubscriptionCore* subscription);
/// Throws as `SubscriptionCore::setSettings` does.
void applySettings(const OVFeedSettings& settings, SubscriptionCore& subscription);
/// What a new subscription is to have; null for none.
Foundation::Ref<Foundation::Dictionary> dictionaryOf(const std::optional<OVFeedSettings>& settings);

}  // namespace Orvane
