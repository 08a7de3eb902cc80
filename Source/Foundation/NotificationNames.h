#pragma once

#include "Foundation/Uncopyable.h"

#include <atomic>
#include <span>
#include <string_view>

namespace Foundation {

class String;

/// The name of a notification, which is a `String` where one is needed.
class NotificationName : Uncopyable {
 public:
    enum class Channel { Local, Distributed };
    enum class Poster { Anybody, Agent };

    constexpr NotificationName(const char* text, Channel channel, Poster poster = Poster::Anybody)
        : mText(text), mChannel(channel), mPoster(poster) {}

    const char* text() const { return mText; }
    Channel getChannel() const { return mChannel; }
    /// `Agent` for what nobody else is believed: see `BusCenter`.
    Poster getPoster() const { return mPoster; }

    /// The name as a string, which lives as long as the process. Any thread.
    String* string() const;
    operator String*() const { return string(); }

    /// All names of the system, in the order of `NotificationNames`.
    static std::span<const NotificationName* const> all();
    /// The name of this text; null if it is none of the system's.
    static const NotificationName* find(std::string_view text);

 private:
    const char* mText;
    Channel mChannel;
    Poster mPoster;
    mutable std::atomic<String*> mString = nullptr;
};

/// The one table of the names of all notifications. Local ones reach only the process in which
/// they were posted, distributed ones all processes of the user, the poster included. The classes
/// that post them have constants that refer to these.
namespace NotificationNames {

using enum NotificationName::Channel;
using enum NotificationName::Poster;

// Feeds. What the agent's own objects tell each other, the agent tells its clients.
inline constinit const NotificationName kFeedWillRefresh{"Orvane::FeedCore::FeedWillRefresh",
                                                         Local};
inline constinit const NotificationName kFeedBeganUpdate{"Orvane::FeedCore::FeedBeganUpdate",
                                                         Local};
inline constinit const NotificationName kFeedEndedUpdate{"Orvane::FeedCore::FeedEndedUpdate",
                                                         Local};
inline constinit const NotificationName kFeedBeganUpdateDist{"com.tarnwick.orvane.FeedBeganUpdate",
                                                             Distributed, Agent};
inline constinit const NotificationName kFeedEndedUpdateDist{"com.tarnwick.orvane.FeedEndedUpdate",
                                                             Distributed, Agent};
inline constinit const NotificationName kCancelBackgroundRefreshes{
    "Orvane::Feeder::CancelBackgroundRefreshes", Local};

// Enclosures.
inline constinit const NotificationName kEnclosureDownloadStarted{
    "com.tarnwick.orvane.EnclosureDownloadStarted", Distributed, Agent};
inline constinit const NotificationName kEnclosureDownloadProgress{
    "com.tarnwick.orvane.EnclosureDownloadProgress", Distributed, Agent};
inline constinit const NotificationName kEnclosureDownloadEnded{
    "com.tarnwick.orvane.EnclosureDownloadEnded", Distributed, Agent};

// Subscriptions.
inline constinit const NotificationName kRefreshScheduleChanged{
    "Orvane::SubscriptionCore::RefreshScheduleChanged", Local};
inline constinit const NotificationName kUnreadCountChanged{
    "Orvane::SubscriptionCore::UnreadCountChanged", Local};

// The database.
inline constinit const NotificationName kRowsChanged{"Orvane::Table::RowsChanged", Local};
inline constinit const NotificationName kDatabaseClosing{"com.tarnwick.orvane.DBClosing", Local};
inline constinit const NotificationName kDatabaseFatalError{"com.tarnwick.orvane.DBFatalErr",
                                                            Local};
inline constinit const NotificationName kDatabaseChanged{"com.tarnwick.orvane.DBChanged",
                                                         Distributed, Agent};
inline constinit const NotificationName kDatabaseReplaced{"com.tarnwick.orvane.DBReplaced",
                                                          Distributed, Agent};

// Calls and renderings.
inline constinit const NotificationName kCallHandled{"Orvane::IPCServer::CallHandled", Local};
inline constinit const NotificationName kAgentDied{"Orvane::IPCClient::AgentDied", Local};
inline constinit const NotificationName kSCGIHandlerCreated{
    "Orvane::SCGIHandler::SCGIHandlerCreated", Local};

// The machine.
inline constinit const NotificationName kWillSleep{"Foundation::SleepNotifier::WillSleep", Local};
inline constinit const NotificationName kDidWake{"Foundation::SleepNotifier::DidWake", Local};
inline constinit const NotificationName kNetworkChanged{"Foundation::NetworkConfig::NetworkChanged",
                                                        Local};

}  // namespace NotificationNames
}  // namespace Foundation
