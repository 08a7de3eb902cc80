#include "Bridges/FeedRefreshing.h"

#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/NotificationNames.h"
#include "Model/AgentLink.h"

#include <exception>

using namespace Foundation;

namespace Orvane {

FeedRefreshing::~FeedRefreshing() {
    callGuarded("FeedRefreshing::~FeedRefreshing()", [this] { stopListening(); });
}

bool FeedRefreshing::startRefresh() {
    if (SubscriptionCore* subscription = _subscriptionCore()) {
        if (!subscription->startRefresh()) return false;
        _beginRefresh();
        return true;
    }
    if (!mFeedListener) listen(nullptr, _feedCore());
    const unsigned ended = mEndedRefreshes;
    if (!_feedCore()->refresh(false, true)) return false;
    // It may be over already.
    if (mEndedRefreshes == ended) _beginRefresh();
    return true;
}

void FeedRefreshing::_beginRefresh() {
    if (!mRefreshing) {
        mRefreshing = true;
        mSelf = self();
        post(OVFeedRefreshingNotification);
        tellDelegate([](OVClientDelegate& delegate, const std::shared_ptr<OVFeed>& feed) {
            delegate.feedDidBeginRefresh(feed);
        });
    }
    _listenForAgentDeath();
}

void FeedRefreshing::_endRefresh() {
    ++mEndedRefreshes;
    if (!mRefreshing) return;
    // The object may end with this reference.
    const std::shared_ptr<OVFeed> feed = std::move(mSelf);
    mSelf = nullptr;
    mRefreshing = false;
    post(OVFeedRefreshingNotification);
    tellDelegate([](OVClientDelegate& delegate, const std::shared_ptr<OVFeed>& self) {
        delegate.feedDidEndRefresh(self);
    });
}

void FeedRefreshing::_listenForAgentDeath() {
    if (!_subscriptionCore()) return;
    AgentLink::current().listenForAgentDeath();
    if (mFeedListener) return;
    gLogIPC.log("%@ listening for agent-died notifications", getOwner());
    listen(NotificationNames::kAgentDied, nullptr);
}

void FeedRefreshing::_agentDied() {
    const std::shared_ptr<OVFeed> keep = self();
    _endRefresh();
    stopListening();
}

void FeedRefreshing::listen(String* name, void* object) {
    mFeedListener = std::make_unique<Receiver>(this, &FeedRefreshing::feedNotified);
    NotificationCenter::getLocal()->addObserver(mFeedListener.get(), name, object);
}

void FeedRefreshing::stopListening() {
    if (!mFeedListener) return;
    NotificationCenter::getLocal()->removeObserver(mFeedListener.get());
    mFeedListener = nullptr;
}

void FeedRefreshing::feedNotified(Notification* notification) {
    const std::shared_ptr<OVFeed> keep = self();
    try {
        handleNotification(*notification);
    } catch (const std::exception& exception) {
        gWarn.log("OVFeed: Exception handling feed change: %s", exception.what());
    } catch (...) {
        gWarn.log("OVFeed: Exception handling feed change: %s", "of an unknown kind");
    }
}

void FeedRefreshing::handleNotification(const Notification& notification) {
    const std::string& name = notification.name->utf8();
    if (name == NotificationNames::kAgentDied.text()) return _agentDied();
    if (notification.object != _feedCore()) return;
    if (name == FeedCore::kWillRefreshNotification.text()) {
        _beginRefresh();
    } else if (name == FeedCore::kEndedUpdateLocalNotification.text()) {
        _endRefresh();
    }
}

}  // namespace Orvane
