// What looks at a running Orvane: events as they come, and what is wrong.

#include "CommandLine/CommandLineTest.h"
#include "Support/PipedChild.h"

namespace {

using Support::ServerAnswer;
using testing::HasSubstr;

class Watch : public CommandLineTest {
 protected:
    /// A line that comes when the program hears of changes: of a change that is made again and
    /// again until it is told.
    static void flagUntil(const std::function<bool()>& isTold) {
        for (int i = 0; i < 200 && !isTold(); ++i) {
            runOrvane({i % 2 == 0 ? "flag" : "unflag", "One"});
        }
        EXPECT_TRUE(isTold());
    }
    std::string out() const { return contentOf(home / "events"); }
    /// Runs it in the background, with its output in a file.
    std::unique_ptr<Support::BackgroundProcess> watch(const std::string& options) {
        return std::make_unique<Support::BackgroundProcess>(std::vector<std::string>{
            "sh", "-c",
            "exec " ORVANE_PROGRAM " watch " + options + " > '" + (home / "events") + "'"});
    }
};

using Doctor = CommandLineTest;

}  // namespace

TEST_F(Watch, WritesALineForEachEvent) {
    add("/feed");
    const auto program = watch("-e flags --jsonl");
    flagUntil([&] { return out().find('\n') != std::string::npos; });
    const JSON event = JSON::parse(out().substr(0, out().find('\n')));
    EXPECT_EQ(event["schema"], 1);
    EXPECT_EQ(event["event"], "flags");
    EXPECT_EQ(event["title"], "One");
    EXPECT_EQ(event["feed"], "The feed");
    EXPECT_EQ(event["url"], "http://e.org/One");
}

TEST_F(Watch, RunsACommandAndEndsAfterSoManyEvents) {
    add("/feed");
    // What ends by itself is waited for by its output.
    const auto program = watch("-n 1 -e flags --exec 'echo \"$ORVANE_EVENT:$ORVANE_TITLE\"'");
    flagUntil([&] { return !out().empty(); });
    EXPECT_EQ(out(), "flags:One\n");
}

TEST_F(Watch, RefusesEventsThatThereAreNot) {
    EXPECT_THAT(run({"watch", "-e", "aded"}, 2).err, HasSubstr("did you mean added?"));
}

TEST_F(Doctor, FindsNothingWhereAllIsWell) {
    add("/feed");
    const JSON all = json({"doctor"});
    std::map<std::string, std::string> results;
    for (const JSON& each : all["findings"]) {
        results[each["what"]] = each["result"];
    }
    for (const char* what : {"storage", "message bus", "agent", "database", "clock"}) {
        EXPECT_EQ(results[what], "good") << what;
    }
    EXPECT_THAT(run({"doctor"}).err, HasSubstr("No problems."));
}

TEST_F(Doctor, NamesACureForEachFailingFeed) {
    server.answer("/closed", ServerAnswer(401).header("WWW-Authenticate", "Basic realm=\"x\""));
    run({"add", "--force", server.url("/gone"), server.url("/closed")}, 4);
    const Support::ChildResult result = run({"doctor"}, 5);
    EXPECT_THAT(result.out, HasSubstr("it is gone: orvane rm "));
    EXPECT_THAT(result.out, HasSubstr(" login NAME password -"));
    EXPECT_THAT(result.err, HasSubstr("2 problems found."));
}

TEST_F(Doctor, NamesACureWhereThereIsNoAgent) {
    agent.reset();
    const Support::ChildResult result = run({"doctor"}, 7);
    EXPECT_THAT(result.out,
                HasSubstr("agent\tproblem\tthe message bus does not know how to start it\t"
                          "install orvane-agent"));
    EXPECT_THAT(result.out, HasSubstr("database\tproblem\t"));
}
