#include "CommandLine/Discovery.h"

#include "CommandLine/Failure.h"
#include "Support/TempDir.h"

#include <gmock/gmock.h>

using Commands::Discovery;
using Commands::Failure;
using testing::ElementsAre;

TEST(Discovery, TakesAllFormsOfURLs) {
    EXPECT_THAT(Discovery::sourcesOf("http://e.org/feed"), ElementsAre("http://e.org/feed"));
    EXPECT_THAT(Discovery::sourcesOf("e.org/feed"), ElementsAre("https://e.org/feed"));
    EXPECT_THAT(Discovery::sourcesOf("e.org:8080"), ElementsAre("https://e.org:8080"));
    EXPECT_THAT(Discovery::sourcesOf("feed:https://e.org/f"), ElementsAre("https://e.org/f"));
    EXPECT_THAT(Discovery::sourcesOf("feed://e.org/f"), ElementsAre("http://e.org/f"));
    EXPECT_THAT(Discovery::sourcesOf("feeds:Both&e.org/a&e.org/b"),
                ElementsAre("http://e.org/a", "http://e.org/b"));
    EXPECT_THROW(Discovery::sourcesOf("feed:"), Failure);
}

TEST(Discovery, TakesFiles) {
    const Support::TempDir dir;
    const std::string file = dir.writeFile("feed.xml", "<rss/>");
    EXPECT_THAT(Discovery::sourcesOf(file), ElementsAre("file://" + file));
}

TEST(Discovery, FindsTheFeedsOfAPageOnce) {
    const OVDocument page = OVDocument::read(
        "<html><head><link rel='alternate' type='application/rss+xml' title='A' href='a'>"
        "<link rel='alternate' type='application/atom+xml' href='/b'>"
        "<link rel='alternate' type='application/rss+xml' href='a'>"
        "<link rel='stylesheet' href='s.css'></head></html>",
        "http://e.org/dir/");
    const std::vector<Discovery::Candidate> found = Discovery::linksOf(page);
    ASSERT_EQ(found.size(), 2U);
    EXPECT_EQ(found[0].url, "http://e.org/dir/a");
    EXPECT_EQ(found[0].title, "A");
    EXPECT_EQ(found[1].url, "http://e.org/b");
}
