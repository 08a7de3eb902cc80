#include "Foundation/NotificationNames.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/String.h"

#include <gtest/gtest.h>

#include <set>

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
