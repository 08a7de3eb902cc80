#include "Foundation/NotificationNames.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/String.h"

#include <gtest/gtest.h>

#include <set>
#include <string>
#include <vector>

using namespace Foundation;

TEST(NotificationNames, AreListedOnceEach) {
    std::set<std::string_view> texts;
    for (const NotificationName* name : NotificationName::all()) {
        EXPECT_TRUE(texts.insert(name->text()).second) << name->text();
        EXPECT_EQ(NotificationName::find(name->text()), name);
    }
    EXPECT_EQ(texts.size(), 22u);
    EXPECT_EQ(NotificationName::find("com.tarnwick.orvane.Unknown"), nullptr);
}

TEST(NotificationNames, HaveTheirTexts) {
    std::vector<std::string> texts;
    for (const NotificationName* name : NotificationName::all()) {
        const bool isLocal = name->getChannel() == NotificationName::Channel::Local;
        texts.push_back((isLocal ? "local " : "") + std::string(name->text()));
    }
    EXPECT_EQ(texts, std::vector<std::string>({
                         "local Orvane::FeedCore::FeedWillRefresh",
                         "local Orvane::FeedCore::FeedBeganUpdate",
                         "local Orvane::FeedCore::FeedEndedUpdate",
                         "com.tarnwick.orvane.FeedBeganUpdate",
                         "com.tarnwick.orvane.FeedEndedUpdate",
                         "local Orvane::Feeder::CancelBackgroundRefreshes",
                         "com.tarnwick.orvane.EnclosureDownloadStarted",
                         "com.tarnwick.orvane.EnclosureDownloadProgress",
                         "com.tarnwick.orvane.EnclosureDownloadEnded",
                         "local Orvane::SubscriptionCore::RefreshScheduleChanged",
                         "local Orvane::SubscriptionCore::UnreadCountChanged",
                         "local Orvane::Table::RowsChanged",
                         "local com.tarnwick.orvane.DBClosing",
                         "local com.tarnwick.orvane.DBFatalErr",
                         "com.tarnwick.orvane.DBChanged",
                         "com.tarnwick.orvane.DBReplaced",
                         "local Orvane::IPCServer::CallHandled",
                         "local Orvane::IPCClient::AgentDied",
                         "local Orvane::SCGIHandler::SCGIHandlerCreated",
                         "local Foundation::SleepNotifier::WillSleep",
                         "local Foundation::SleepNotifier::DidWake",
                         "local Foundation::NetworkConfig::NetworkChanged",
                     }));
}

TEST(NotificationNames, AreOneStringEach) {
    String* name = NotificationNames::kDatabaseChanged;
    EXPECT_EQ(name->view(), "com.tarnwick.orvane.DBChanged");
    EXPECT_EQ(name, NotificationNames::kDatabaseChanged.string());
}

TEST(NotificationNames, OnlyTheAgentPostsTheDistributedOnes) {
    std::set<std::string_view> agents;
    for (const NotificationName* name : NotificationName::all()) {
        const bool isDistributed = name->getChannel() == NotificationName::Channel::Distributed;
        const bool isAgents = name->getPoster() == NotificationName::Poster::Agent;
        EXPECT_EQ(isDistributed, isAgents) << name->text();
        if (isAgents) agents.insert(name->text());
    }
    EXPECT_EQ(agents, std::set<std::string_view>({
                          "com.tarnwick.orvane.FeedBeganUpdate",
                          "com.tarnwick.orvane.FeedEndedUpdate",
                          "com.tarnwick.orvane.EnclosureDownloadStarted",
                          "com.tarnwick.orvane.EnclosureDownloadProgress",
                          "com.tarnwick.orvane.EnclosureDownloadEnded",
                          "com.tarnwick.orvane.DBChanged",
                          "com.tarnwick.orvane.DBReplaced",
                      }));
}
