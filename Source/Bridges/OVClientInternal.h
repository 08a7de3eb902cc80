#pragma once

#include "Bridges/OVInternal.h"
#include "Bridges/OnceList.h"
#include "Foundation/Date.h"
#include "Foundation/Dictionary.h"
#include "Foundation/Notification.h"
#include "Foundation/Timer.h"
#include "Model/ClientCore.h"

#include <Orvane/OVClient.h>

#include <memory>
#include <string>
#include <string_view>
#include <vector>

/// The state of an `OVClient`: what it hears of, and what it tells.
class OVClientInternal : public OVInternal {
 public:
    static constexpr double kRefreshDelaySeconds = 5.0;

    OVClientInternal();
    ~OVClientInternal() override;

    /// Makes the object stand for a row. It begins to listen.
    void _initWithCore(Orvane::ClientCore* core, OVObject* owner);

    /// The application's own, which is kept here; null before the first use.
    static std::shared_ptr<OVClient>& applicationClient();

    /// The row, for use: see `OVInternal::useCore`.
    Orvane::ClientCore& core() const { return static_cast<Orvane::ClientCore&>(useCore()); }
    /// The same to look at; null only while the object is made.
    Orvane::ClientCore* peek() const { return static_cast<Orvane::ClientCore*>(getCore()); }
    const std::string& getSignature() const { return mSignature; }
    std::shared_ptr<OVClient> self() const;

    /// See `OVClient`.
    void sendChangesSinceDate(Foundation::Date* date);

    Foundation::Ref<Foundation::Date> dateLastUpdated;
    bool tracksEntryChanges = true;

 protected:
    Rank getRank() const override { return Rank::Client; }
    Foundation::Ref<Orvane::Core> findAgain() override;

 private:
    using Notification = Foundation::Notification;
    using Receiver = Orvane::MethodReceiver<Notification, OVClientInternal>;
    using Timer = Foundation::Timer<OVClientInternal>;
    using Feeds = Orvane::OnceList<std::shared_ptr<OVFeed>>;

    void observe();
    void stopObserving();
    void tableChanged(Notification* notification);
    void noteTableChange(const Notification& notification);
    void feedNotified(Notification* notification);

    void _refreshNonBackgroundSubscriptions();
    void _sendChanges();
    void handleSubscriptions();
    void _handleSubscriptionNotification(const Foundation::Dictionary& changes);
    void _handleFeedNotification(std::string_view name, std::string_view sender);
    void _handleDownloadNotification(const std::vector<std::string_view>& parts, bool reload);

    Foundation::Ref<Foundation::Date> collectChanges(Foundation::Date* since, Feeds& feeds);

    std::string mSignature;  ///< by which the client is found again
    Receiver mTableObserver{this, &OVClientInternal::tableChanged};
    Receiver mFeedObserver{this, &OVClientInternal::feedNotified};
    Timer mRefreshTimer{this, &OVClientInternal::_refreshNonBackgroundSubscriptions};
    Timer mChangesTimer{this, &OVClientInternal::_sendChanges};
    Timer mSubscriptionsTimer{this, &OVClientInternal::handleSubscriptions};
    std::vector<Foundation::Ref<Foundation::Dictionary>> mSubscriptionChanges;  ///< still to handle
};
