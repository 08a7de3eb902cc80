#include "Net/CookieAcceptPolicyObserver.h"

#include "Foundation/DistributedNotificationCenter.h"
#include "Foundation/String.h"
#include "Net/HTTPCookieStorage.h"

namespace Orvane {

using Foundation::NotificationCenter;
using Foundation::Ref;
using Foundation::String;

CookieAcceptPolicyObserver::CookieAcceptPolicyObserver(HTTPCookieStorage* storage)
    : mStorage(storage) {
    const Ref<String> name = String::string(kPolicyChangedNotification);
    NotificationCenter::getDistributed()->addObserver(this, name, nullptr);
}

CookieAcceptPolicyObserver::~CookieAcceptPolicyObserver() {
    NotificationCenter::getDistributed()->removeObserver(this);
}

void CookieAcceptPolicyObserver::operator()(void*) {
    mStorage->syncAcceptPolicyWithPreferences();
}

}  // namespace Orvane
