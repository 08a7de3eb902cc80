// What shows and changes nothing.

#include "CommandLine/CommandLineTest.h"
#include "Support/PipedChild.h"

namespace {

using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

using ReadingVerbs = CommandLineTest;

}  // namespace

TEST_F(ReadingVerbs, ListFeedsInLinesAndAsJSON) {
    EXPECT_THAT(run({"feeds"}, 1).err, HasSubstr("orvane add URL"));
    add("/feed");
    add("/other");
    const std::string out = run({"feeds"}).out;
    EXPECT_THAT(out, HasSubstr("\t1\tAnother feed\t"));
    EXPECT_THAT(out, HasSubstr("\t2\tThe feed\t"));
    EXPECT_LT(out.find("Another"), out.find("The feed"));
    const JSON all = json({"feeds"});
    EXPECT_EQ(all["schema"], 1);
    ASSERT_EQ(all["feeds"].size(), 2U);
    EXPECT_EQ(all["feeds"][1]["title"], "The feed");
    EXPECT_EQ(all["feeds"][1]["unread"], 2);
    EXPECT_EQ(all["feeds"][1]["url"], server.url("/feed"));
    EXPECT_TRUE(all["feeds"][1]["error"].is_null());
    EXPECT_FALSE(all["feeds"][1]["nextDue"].is_null());
    EXPECT_EQ(json({"feeds", "another"})["feeds"].size(), 1U);
    run({"feeds", "--failing"}, 1);
}

TEST_F(ReadingVerbs, ListEntriesThatAreChosen) {
    add("/feed");
    add("/other");
    EXPECT_EQ(ids().size(), 3U);
    EXPECT_EQ(ids({"--feed", "The feed"}).size(), 2U);
    EXPECT_EQ(ids({"The feed", "another"}).size(), 3U);
    EXPECT_EQ(ids({"-n", "1"}).size(), 1U);
    EXPECT_EQ(ids({"--search", "about three"}).size(), 1U);
    EXPECT_EQ(ids({"--since", "yesterday"}).size(), 3U);
    EXPECT_EQ(ids({"--until", "yesterday"}).size(), 0U);
    EXPECT_EQ(run({"entries", "--sort", "title", "--format", "{title}\\t<{url}>"}).out,
              "One\t<http://e.org/One>\nThree\t<http://e.org/Three>\nTwo\t<http://e.org/Two>\n");
    EXPECT_THAT(run({"entries", "--flagged"}, 1).err, HasSubstr("No such entries."));
    const JSON all = json({"entries", "--search", "three"});
    ASSERT_EQ(all["entries"].size(), 1U);
    EXPECT_EQ(all["entries"][0]["title"], "Three");
    EXPECT_EQ(all["entries"][0]["feed"], "Another feed");
    EXPECT_EQ(all["entries"][0]["read"], false);
    const std::string lines = run({"entries", "--jsonl"}).out;
    EXPECT_EQ(std::count(lines.begin(), lines.end(), '\n'), 3);
    EXPECT_EQ(JSON::parse(lines.substr(0, lines.find('\n')))["schema"], 1);
}

TEST_F(ReadingVerbs, NameEntriesByIdentifierURLAndTitle) {
    add("/feed");
    const std::vector<std::string> all = ids({"--sort", "title"});
    ASSERT_EQ(all.size(), 2U);
    const std::string prefix = all[0].substr(0, 7);
    for (const std::string& name : {all[0], prefix, std::string("http://e.org/One"),
                                    std::string("one"), std::string("One")}) {
        EXPECT_EQ(json({"show", name})["id"], all[0]) << name;
    }
    EXPECT_THAT(run({"show", "nothing of that"}, 3).err, HasSubstr("orvane entries"));
    EXPECT_THAT(run({"show", "o"}, 3).err, HasSubstr("may be 2 entries"));
    EXPECT_THAT(run({"entries", "--feed", "The fed"}, 3).err,
                HasSubstr("did you mean \"The feed\"?"));
}

TEST_F(ReadingVerbs, ShowAnEntryWithNumberedLinks) {
    add("/feed");
    const std::string text = run({"show", "One"}).out;
    EXPECT_THAT(text, StartsWith("One\nFeed      The feed\n"));
    EXPECT_THAT(text, HasSubstr("\nAbout One [1]\n\n[1] " + server.url("/x") + "\n"));
    EXPECT_EQ(run({"show", "--links", "One"}).out, "[1] " + server.url("/x") + "\n");
    EXPECT_THAT(run({"show", "--html", "One"}).out, HasSubstr("<p>About <a "));
    EXPECT_THAT(run({"show", "--xml", "One"}).out, HasSubstr("<title"));
    // Looking at it leaves it unread.
    EXPECT_EQ(ids({"--unread"}).size(), 2U);
}

TEST_F(ReadingVerbs, ShowTablesOnATerminal) {
    add("/feed");
    const auto onTerminal = [&](const std::string& line) {
        return runInShell("COLUMNS=60 TERM=xterm script -qec '" ORVANE_PROGRAM " " + line +
                          "' /dev/null < /dev/null")
            .out;
    };
    const std::string table = onTerminal("feeds");
    EXPECT_THAT(table, HasSubstr("UNREAD"));
    EXPECT_THAT(table, HasSubstr("just now"));
    EXPECT_THAT(table, HasSubstr("\033[1m"));
    EXPECT_THAT(runInShell("NO_COLOR=1 TERM=xterm script -qec '" ORVANE_PROGRAM " feeds' /dev/null "
                           "< /dev/null")
                    .out,
                Not(HasSubstr("\033[1m")));
    EXPECT_THAT(onTerminal("entries"), HasSubstr("TITLE"));
}

TEST_F(ReadingVerbs, TellTheStatus) {
    add("/feed");
    const JSON status = json({"status"});
    EXPECT_EQ(status["schema"], 1);
    EXPECT_EQ(status["agent"], "running");
    EXPECT_EQ(status["client"], "com.tarnwick.Brisko");
    EXPECT_EQ(status["feeds"], 1);
    EXPECT_EQ(status["unread"], 2);
    EXPECT_GT(status["databaseBytes"], 1000);
    EXPECT_THAT(run({"status"}).out, HasSubstr("Agent\trunning\n"));
}

TEST_F(ReadingVerbs, InspectWhatIsOnTheWeb) {
    const JSON feed = JSON::parse(run({"inspect", "--json", server.url("/feed")}).out);
    EXPECT_EQ(feed["kind"], "feed");
    EXPECT_EQ(feed["entries"].size(), 2U);
    server.answer("/page", Support::ServerAnswer().body(
                               "<html><head><link rel='alternate' type='application/rss+xml' "
                               "href='f'></head><body>x</body></html>"));
    const JSON page = JSON::parse(run({"inspect", "--json", server.url("/page")}).out);
    EXPECT_EQ(page["kind"], "page");
    EXPECT_EQ(page["page"]["links"][0]["url"], server.url("/f"));
    EXPECT_THAT(run({"inspect", server.url("/gone")}, 4).err, HasSubstr("/gone"));
    // Nothing of it is subscribed to.
    run({"feeds"}, 1);
}

TEST_F(ReadingVerbs, HoldNothingWhileNobodyReadsTheirPipe) {
    std::vector<std::string> titles;
    for (int i = 0; i < 300; ++i) {
        titles.push_back("Entry number " + std::to_string(i));
    }
    server.answer("/long", Support::ServerAnswer().body(feed("Long", titles)));
    add("/long");
    // More than a pipe holds.
    Support::PipedChild reader({ORVANE_PROGRAM, "entries", "--jsonl"});
    EXPECT_THAT(reader.readLine(), HasSubstr("Entry number"));
    EXPECT_THAT(run({"mark", "read", "--all"}).err, HasSubstr("300 entries"));
    EXPECT_THAT(run({"rm", "Long"}).out, HasSubstr("Long"));
    std::size_t lines = 1;
    while (!reader.readLine().empty()) {
        ++lines;
    }
    EXPECT_EQ(lines, 300U);
    EXPECT_EQ(reader.wait(), 0);
}

TEST_F(ReadingVerbs, MakeTheClientWithSettingsOfItsOwn) {
    const Support::ChildResult first = run({"status"});
    EXPECT_THAT(first.err, HasSubstr("orvane set --default expire"));
    EXPECT_EQ(run({"status"}).err, "");
    const std::string settings = run({"set", "--default"}).out;
    EXPECT_THAT(settings, HasSubstr("expire\tnever\tthe client\n"));
    EXPECT_THAT(settings, HasSubstr("max-enclosure\t500.0 MB\tthe client\n"));
    EXPECT_EQ(json({"status", "--client", "org.example.Other"})["client"], "org.example.Other");
}

TEST_F(ReadingVerbs, DoNotNeedTheAgentOnceThereIsADatabase) {
    add("/feed");
    agent.reset();
    EXPECT_EQ(ids().size(), 2U);
    EXPECT_EQ(json({"status"})["agent"], "not running, started when needed");
    EXPECT_EQ(json({"feeds"})["feeds"].size(), 1U);
}

TEST_F(ReadingVerbs, SayWhatToDoWithoutABusOrADatabase) {
    agent.reset();
    const std::string none = home.makeDirectory("none");
    const Support::EnvVar empty("XDG_DATA_HOME", none.c_str());
    const Support::ChildResult result = run({"feeds"}, 7);
    EXPECT_THAT(result.err, HasSubstr("orvane doctor"));
    const std::string file = home.writeFile("file", "no folder");
    const Support::EnvVar unwritable("XDG_DATA_HOME", file.c_str());
    EXPECT_THAT(run({"feeds"}, 8).err, HasSubstr("XDG_DATA_HOME"));
}
