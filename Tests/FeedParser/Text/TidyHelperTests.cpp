#include "FeedParser/Text/TidyHelper.h"

#include "FeedParser/Text/Bounds.h"
#include "FeedParser/Text/HTMLSnippetTidier.h"
#include "FeedParser/Text/TidierAsked.h"
#include "Support/EnvVar.h"
#include "Support/LogCapture.h"
#include "Support/TempDir.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/wait.h>

#include <cerrno>
#include <csignal>
#include <filesystem>
#include <string>

using namespace Foundation;
using namespace Orvane::FeedParser;

namespace {

/// Far more than any machine should need.
constexpr double kLong = 60;
/// Far less than Tidy needs for what hangs.
constexpr double kShort = 0.1;

TidyResult tidy(TidyHelper& helper, const std::string& markup) {
    const AutoreleasePool pool;
    return helper.tidy("HTMLSnippetTidier", markup, 1, nullptr);
}

/// Half a megabyte of blocks, in each of which Tidy repeats the open inlines.
std::string whatHangs() {
    std::string markup;
    for (int i = 0; i < 60000; ++i)
        markup += "<font><p>x";
    return markup;
}

bool isThere(pid_t pid) {
    return kill(pid, 0) == 0;
}

}  // namespace

TEST(TidyHelper, TidiesOneDocumentAfterTheOther) {
    TidyHelper helper(kLong);
    EXPECT_EQ(helper.getPID(), -1);
    const TidyResult first = tidy(helper, "<b>x");
    EXPECT_TRUE(first.isSuccess());
    EXPECT_EQ(first.output, "<b>x</b>");
    const pid_t pid = helper.getPID();
    EXPECT_TRUE(isThere(pid));
    EXPECT_EQ(tidy(helper, "<i>y").output, "<i>y</i>");
    EXPECT_EQ(helper.getPID(), pid);
    helper.stop();
    EXPECT_EQ(helper.getPID(), -1);
    EXPECT_FALSE(isThere(pid));
}

TEST(TidyHelper, IsKilledAtTheDeadlineAndStartedAnew) {
    const Support::LoggingOn on({&Orvane::gLogParser});
    const Support::LogCapture log;
    TidyHelper helper(kShort);
    const TidyResult result = tidy(helper, whatHangs());
    EXPECT_EQ(result.code, TidyResult::kNothing);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.messages, "it took too long");
    EXPECT_EQ(helper.getPID(), -1);
    EXPECT_TRUE(log.contains("A document has reached the bound \"kTidySeconds\", 0"));
    TidyHelper patient(kLong);
    EXPECT_EQ(tidy(patient, "<b>x").output, "<b>x</b>");
}

TEST(TidyHelper, IsReapedByTheLoopWhenItHasEnded) {
    TidyHelper helper(kLong);
    tidy(helper, "<b>x");
    const pid_t pid = helper.getPID();
    kill(pid, SIGKILL);
    EXPECT_TRUE(Support::turnUntil([&] { return helper.getPID() == -1; }));
    EXPECT_FALSE(isThere(pid));
    EXPECT_EQ(tidy(helper, "<b>x").output, "<b>x</b>");
}

TEST(TidyHelper, IsStartedAnewWhereTheLastOneHasEnded) {
    TidyHelper helper(kLong);
    tidy(helper, "<b>x");
    const pid_t pid = helper.getPID();
    kill(pid, SIGKILL);
    siginfo_t info;
    while (waitid(P_PID, static_cast<id_t>(pid), &info, WEXITED | WNOWAIT) < 0 && errno == EINTR) {
    }
    EXPECT_EQ(tidy(helper, "<i>y").output, "<i>y</i>");
    EXPECT_NE(helper.getPID(), pid);
}

TEST(TidyHelper, IsBounded) {
    TidyHelper helper(kLong);
    tidy(helper, "<b>x");
    rlimit limit = {};
#ifndef __SANITIZE_ADDRESS__
    ASSERT_EQ(prlimit(helper.getPID(), RLIMIT_AS, nullptr, &limit), 0);
    EXPECT_EQ(limit.rlim_cur, Bounds::kTidyMemory);
#endif
    ASSERT_EQ(prlimit(helper.getPID(), RLIMIT_CPU, nullptr, &limit), 0);
    EXPECT_EQ(limit.rlim_cur, Bounds::kTidyProcessorSeconds + 1);
    ASSERT_EQ(prlimit(helper.getPID(), RLIMIT_FSIZE, nullptr, &limit), 0);
    EXPECT_EQ(limit.rlim_cur, 0u);
}

TEST(TidyHelper, WarnsOnceWhereThereIsNoProgram) {
    const Support::TempDir folder;
    const Support::EnvVar programs("ORVANE_PROGRAMS", folder.path().c_str());
    const Support::LogCapture log;
    TidyHelper helper(kLong);
    EXPECT_EQ(tidy(helper, "<b>x").code, TidyResult::kNothing);
    EXPECT_EQ(tidy(helper, "<b>x").messages, "orvane-tidy does not start");
    EXPECT_EQ(log.count("Can't start " + (folder / "orvane-tidy")), 1);
}

TEST(TidyHelper, WarnsWhereTheProgramIsAnother) {
    const Support::TempDir folder;
    const std::string path = folder.writeFile("orvane-tidy", "#!/bin/sh\nexit 0\n");
    std::filesystem::permissions(path, std::filesystem::perms::owner_all);
    const Support::EnvVar programs("ORVANE_PROGRAMS", folder.path().c_str());
    const Support::LogCapture log;
    TidyHelper helper(kLong);
    EXPECT_EQ(tidy(helper, "<b>x").code, TidyResult::kNothing);
    EXPECT_EQ(log.count(path + " does not start"), 1);
    EXPECT_EQ(helper.getPID(), -1);
}

TEST(TidyHelper, SaysWhyThereIsNoResult) {
    const AutoreleasePool pool;
    TidyHelper helper(kLong);
    EXPECT_EQ(helper.tidy("NoSuchTidier", "<b>x", 1, nullptr).messages, "there is no such tidier");
    const std::string tooLong(Bounds::kTidyBytes + 1, '<');
    EXPECT_EQ(tidy(helper, tooLong).messages, "it is too long");
    const Support::TempDir folder;
    const Support::EnvVar programs("ORVANE_PROGRAMS", folder.path().c_str());
    TidyHelper::getShared().stop();
    const Support::LoggingOn on({&Orvane::gLogParser});
    const Support::LogCapture log;
    EXPECT_EQ(TidierAsked<HTMLSnippetTidier>().tidy("<table>"), "(null)");
    EXPECT_TRUE(
        log.contains("[Parser] Not tidied (7 bytes, encoding=1, baseURL=(null)): "
                     "orvane-tidy does not start"));
}

TEST(TidyHelper, GetsWhatIsNotSmall) {
    std::string markup;
    for (int i = 0; i < 2000; ++i)
        markup += "<b>xxxxxx</b> <br>";
    TidierAsked<HTMLSnippetTidier> tidier;
    EXPECT_EQ(tidier.tidy("<b>x</b>"), "<b>x</b>");
    EXPECT_EQ(TidyHelper::getShared().getPID(), -1);
    const std::string tidied = tidier.tidy(markup);
    EXPECT_GT(TidyHelper::getShared().getPID(), 0);
    const Ref<HTMLSnippetTidier> here = Returner<HTMLSnippetTidier>::adopted(new HTMLSnippetTidier);
    EXPECT_EQ(tidied, here->tidyHere(markup, 1, nullptr).output);
    TidyHelper::getShared().stop();
}
