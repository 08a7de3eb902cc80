#pragma once

#include "Bridges/FeedChanges.h"

#include <Orvane/OVFeedSettings.h>

#include <optional>
#include <string>

namespace Orvane {
class ClientCore;
}

/// The state of an `OVFeed`.
class OVFeedInternal : public Orvane::FeedChanges {
 public:
    /// Makes the object stand for a feed and for the subscription to it, which may be null.
    void _initWithFeedCore(Orvane::FeedCore* feedCore, Orvane::SubscriptionCore* subscriptionCore,
                           OVObject* owner);

    const std::string& getURL() const { return mURL; }

    /// Whether the client has it now; false if it had a feed of that URL before. Throws
    /// `OVException` for a feed that has a client.
    bool _addToClient(Orvane::ClientCore& client);
    /// Ends the subscription. Whether the agent did it, which is reported.
    bool _remove();
    std::optional<OVFeedSettings> getSettings() const;
    void setSettings(const std::optional<OVFeedSettings>& settings);

 protected:
    Rank getRank() const override { return Rank::Feed; }
    Foundation::Ref<Orvane::Core> findAgain() override;
    void foundAgain() override;

 private:
    void adopt(Orvane::SubscriptionCore* subscription);
    void becomeUnsubscribed();

    // By which the feed is found again.
    std::string mURL;
    std::string mClientSignature;
    std::optional<OVFeedSettings> mTemporarySettings;  ///< of a feed in memory
};
