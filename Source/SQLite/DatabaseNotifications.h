#pragma once

#include "Foundation/NotificationNames.h"

namespace SQLite {

/// What a database announces: within the process that it closes and that an error is fatal, to all
/// processes that a commit has changed it and that another file has taken its place.
struct DatabaseNotifications {
    static constexpr const Foundation::NotificationName& kDatabaseClosingNotification =
        Foundation::NotificationNames::kDatabaseClosing;
    static constexpr const Foundation::NotificationName& kDatabaseFatalErrorNotification =
        Foundation::NotificationNames::kDatabaseFatalError;
    static constexpr const Foundation::NotificationName& kDatabaseChangedNotification =
        Foundation::NotificationNames::kDatabaseChanged;
    static constexpr const Foundation::NotificationName& kDatabaseReplacedNotification =
        Foundation::NotificationNames::kDatabaseReplaced;
};

}  // namespace SQLite
