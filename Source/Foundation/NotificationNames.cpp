#include "Foundation/NotificationNames.h"

#include "Foundation/String.h"

namespace Foundation {

String* NotificationName::string() const {
    String* known = mString;
    if (known) return known;
    String* const made = String::string(mText).detach();
    // Of two threads that are here at once, one keeps what it made.
    if (mString.compare_exchange_strong(known, made)) return made;
    made->release();
    return known;
}

std::span<const NotificationName* const> NotificationName::all() {
    using namespace NotificationNames;
    static constexpr const NotificationName* kAll[] = {
        &kFeedWillRefresh,
        &kFeedBeganUpdate,
        &kFeedEndedUpdate,
        &kFeedBeganUpdateDist,
        &kFeedEndedUpdateDist,
        &kCancelBackgroundRefreshes,
        &kEnclosureDownloadStarted,
        &kEnclosureDownloadProgress,
        &kEnclosureDownloadEnded,
        &kRefreshScheduleChanged,
        &kUnreadCountChanged,
        &kRowsChanged,
        &kDatabaseClosing,
        &kDatabaseFatalError,
        &kDatabaseChanged,
        &kDatabaseReplaced,
        &kCallHandled,
        &kAgentDied,
        &kSCGIHandlerCreated,
        &kWillSleep,
        &kDidWake,
        &kNetworkChanged,
    };
    return kAll;
}

const NotificationName* NotificationName::find(std::string_view text) {
    for (const NotificationName* name : all()) {
        if (name->mText == text) return name;
    }
    return nullptr;
}

}  // namespace Foundation
