#include "Foundation/Prefs.h"

#include "Foundation/ApplicationIdentity.h"
#include "Foundation/Logger.h"
#include "Foundation/PreferenceFolder.h"
#include "Foundation/PreferenceKeys.h"
#include "Foundation/RunLoop.h"
#include "Foundation/UntypedPref.h"
#include "Support/FileAccess.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/file.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>

using namespace Foundation;
using Support::LogCapture;
using Support::LoggingOn;
using Support::ManualClock;

namespace {

constexpr const char* kDomain = "com.example.Test";
constexpr auto kReadOnly = static_cast<std::filesystem::perms>(0555);

/// Preferences of a domain, and what another process sees of them.
class PrefsTest : public testing::Test {
 protected:
    using Lines = std::vector<std::string>;

    void set(const char* key, const char* text, Prefs* of = nullptr) {
        const Ref<String> value = String::string(text);
        UntypedPref(of ? *of : prefs, key) = value;
    }
    std::string get(const char* key) {
        const Ref<String> value = StringReturner(UntypedPref(prefs, key));
        return value->utf8();
    }
    void turn() { RunLoop::current().turn(); }

    /// What another process writes, and reads.
    void writeElsewhere(const std::string& entries) {
        folder.replace(kDomain, PreferenceFolder::xml(entries));
    }
    std::string readElsewhere(const char* key) { return folder.textOf(kDomain, key); }

    ManualClock clock;
    PreferenceFolder folder;
    LogCapture log;
    Prefs prefs{kDomain};
};

auto entry(const std::string& key, const std::string& value) {
    return PreferenceFolder::entry(key, value);
}

}  // namespace

TEST_F(PrefsTest, AChangeShowsAtOnceAndReachesTheDiskInTheNextTurn) {
    set("Key", "value");
    EXPECT_EQ(get("Key"), "value");
    EXPECT_FALSE(folder.exists(kDomain));
    turn();
    EXPECT_EQ(readElsewhere("Key"), "value");
}

TEST_F(PrefsTest, ChangesOfOneTurnCauseOneWrite) {
    LoggingOn on({&gLogPrefs});
    set("One", "1");
    set("Two", "2");
    turn();
    EXPECT_EQ(log.count("[Prefs] Synchronized."), 1);
    const ino_t inode = folder.inodeOf(kDomain);
    turn();
    EXPECT_EQ(folder.inodeOf(kDomain), inode);
    EXPECT_EQ(readElsewhere("One") + readElsewhere("Two"), "12");
}

TEST_F(PrefsTest, SynchronizeWritesAtOnceAndStopsTheSaveToCome) {
    LoggingOn on({&gLogPrefs});
    set("Key", "value");
    prefs.synchronize();
    EXPECT_EQ(readElsewhere("Key"), "value");
    turn();
    EXPECT_EQ(log.count("Synchronized."), 1);
}

TEST_F(PrefsTest, WritesNothingIfNothingChanged) {
    prefs.synchronize();
    EXPECT_FALSE(std::filesystem::exists(folder.path()));
    UntypedPref(prefs, "Key") = nullptr;
    prefs.synchronize();
    EXPECT_FALSE(folder.exists(kDomain));
    set("Key", "value");
    prefs.synchronize();
    const ino_t inode = folder.inodeOf(kDomain);
    prefs.synchronize();
    set("Key", "value");
    prefs.synchronize();
    EXPECT_EQ(folder.inodeOf(kDomain), inode);
}

TEST_F(PrefsTest, AllOfADomainInTheProcessShareIt) {
    Prefs other(kDomain);
    set("Key", "value", &other);
    EXPECT_EQ(get("Key"), "value");
    prefs.synchronize();
    EXPECT_EQ(readElsewhere("Key"), "value");
}

TEST_F(PrefsTest, DomainsAreApart) {
    Prefs other("com.example.Other");
    set("Key", "other", &other);
    EXPECT_EQ(get("Key"), "");
    turn();
    EXPECT_FALSE(folder.exists(kDomain));
    EXPECT_EQ(folder.textOf("com.example.Other", "Key"), "other");
}

TEST_F(PrefsTest, ADomainCannotLeaveTheFolder) {
    Prefs outside("../../outside");
    set("Key", "value", &outside);
    outside.synchronize();
    EXPECT_EQ(folder.names(), std::set<std::string>({"%2E.%2F..%2Foutside.plist"}));
}

TEST_F(PrefsTest, SavesWhatIsStillToBeSavedWhenItEnds) {
    {
        Prefs other(kDomain);
        set("Key", "value", &other);
    }
    EXPECT_EQ(readElsewhere("Key"), "value");
}

TEST_F(PrefsTest, SeesWhatOthersWroteOnceItSynchronizes) {
    EXPECT_EQ(get("Key"), "");
    writeElsewhere(entry("Key", "theirs"));
    EXPECT_EQ(get("Key"), "");
    prefs.synchronize();
    EXPECT_EQ(get("Key"), "theirs");
}

TEST_F(PrefsTest, DoesNotUndoOthersChangesOfOtherKeys) {
    writeElsewhere(entry("A", "old") + entry("B", "old") + entry("C", "old"));
    EXPECT_EQ(get("A"), "old");
    writeElsewhere(entry("A", "old") + entry("B", "theirs") + entry("D", "theirs"));
    set("A", "mine");
    prefs.synchronize();
    EXPECT_EQ(readElsewhere("A"), "mine");
    EXPECT_EQ(readElsewhere("B"), "theirs");
    EXPECT_EQ(readElsewhere("C"), "") << "brought back what another process removed";
    EXPECT_EQ(readElsewhere("D"), "theirs");
    EXPECT_EQ(get("B") + get("C") + get("D"), "theirstheirs");
}

TEST_F(PrefsTest, OfTwoChangesOfAKeyTheLaterWriteStays) {
    set("Key", "mine");
    writeElsewhere(entry("Key", "theirs"));
    prefs.synchronize();
    EXPECT_EQ(readElsewhere("Key"), "mine");
    writeElsewhere(entry("Key", "theirs"));
    prefs.synchronize();
    EXPECT_EQ(readElsewhere("Key"), "theirs");
    EXPECT_EQ(get("Key"), "theirs");
}

TEST_F(PrefsTest, ARemovalIsAChange) {
    writeElsewhere(entry("A", "1") + entry("B", "2"));
    UntypedPref(prefs, "A") = nullptr;
    EXPECT_FALSE(UntypedPref(prefs, "A").exists());
    turn();
    EXPECT_EQ(folder.contentOf(kDomain).find("<key>A</key>"), std::string::npos);
    EXPECT_EQ(readElsewhere("B"), "2");
}

TEST_F(PrefsTest, ADamagedFileIsKeptAsideReportedAndTreatedAsEmpty) {
    folder.replace(kDomain, "damage");
    EXPECT_EQ(get("Key"), "");
    EXPECT_EQ(folder.names(), std::set<std::string>({"com.example.Test.plist.damaged"}));
    ASSERT_EQ(log.lines().size(), 1u);
    EXPECT_TRUE(log.lines()[0].starts_with("[WARNING] The preferences in " + folder.path(kDomain) +
                                           " can't be read ("))
        << log.lines()[0];
    EXPECT_TRUE(log.lines()[0].ends_with(") and are kept as " + folder.path(kDomain) + ".damaged"))
        << log.lines()[0];
    set("Key", "value");
    prefs.synchronize();
    EXPECT_EQ(readElsewhere("Key"), "value");
    EXPECT_EQ(log.lines().size(), 1u);
}

TEST_F(PrefsTest, AFileThatIsDamagedBetweenReadAndWriteIsKeptAsideToo) {
    writeElsewhere(entry("A", "1"));
    EXPECT_EQ(get("A"), "1");
    folder.replace(kDomain, "damage");
    set("B", "2");
    prefs.synchronize();
    EXPECT_EQ(log.count("are kept as"), 1);
    EXPECT_EQ(folder.names(),
              std::set<std::string>({"com.example.Test.plist", "com.example.Test.plist.damaged"}));
    EXPECT_EQ(readElsewhere("A") + readElsewhere("B"), "2");
    EXPECT_EQ(get("A"), "");
}

TEST_F(PrefsTest, ALeftOverTemporaryFileDoesNoHarm) {
    writeElsewhere(entry("A", "1"));
    std::ofstream(folder.path() + "/.orvane-Ab12Cd") << "half a fi";
    EXPECT_EQ(get("A"), "1");
    set("B", "2");
    prefs.synchronize();
    EXPECT_EQ(readElsewhere("A") + readElsewhere("B"), "12");
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(PrefsTest, AFullDiskIsReportedOnceAndTheChangesArePutOff) {
    writeElsewhere(entry("A", "old"));
    LoggingOn on({&gLogPrefs});
    set("A", "new");
    log.clear();
    {
        const Support::FileSizeLimit full(10);
        prefs.synchronize();
        set("B", "new");
        prefs.synchronize();
    }
    EXPECT_EQ(log.count("[WARNING] "), 1);
    EXPECT_EQ(log.count("[WARNING] The preferences in " + folder.path(kDomain) +
                        " can't be saved: File too large"),
              1);
    EXPECT_FALSE(log.contains("Synchronized."));
    EXPECT_EQ(folder.names(), std::set<std::string>({"com.example.Test.plist"}));
    EXPECT_EQ(readElsewhere("A"), "old");
    EXPECT_EQ(get("A") + get("B"), "newnew");

    prefs.synchronize();
    EXPECT_EQ(readElsewhere("A") + readElsewhere("B"), "newnew");
    EXPECT_EQ(log.count("[WARNING] "), 1);
}

TEST_F(PrefsTest, AFailureAfterASuccessIsReportedAgain) {
    for (int i = 1; i <= 2; ++i) {
        set("Key", std::to_string(i).c_str());
        {
            const Support::FileSizeLimit full(0);
            prefs.synchronize();
        }
        EXPECT_EQ(log.count("can't be saved"), i);
        prefs.synchronize();
    }
}

TEST_F(PrefsTest, AHomeThatIsReadOnlyPutsTheChangesOff) {
    namespace fs = std::filesystem;
    writeElsewhere(entry("A", "old"));
    fs::permissions(fs::path(folder.path()).parent_path(), fs::perms::all);
    fs::permissions(folder.path(), kReadOnly);
    fs::permissions(folder.path(kDomain), fs::perms::all);
    set("A", "new");
    std::ofstream(folder.path(kDomain))
        << PreferenceFolder::xml(entry("A", "old") + entry("B", "theirs"));
    {
        const Support::OrdinaryFileAccess ordinary;
        prefs.synchronize();
        prefs.synchronize();
    }
    EXPECT_EQ(log.lines(), Lines({"[WARNING] The preferences in " + folder.path(kDomain) +
                                  " can't be saved: Permission denied"}));
    EXPECT_EQ(get("A"), "new");
    EXPECT_EQ(get("B"), "theirs") << "what others write shows all the same";
    prefs.synchronize();
    EXPECT_EQ(readElsewhere("A"), "new");
}

TEST_F(PrefsTest, ADamagedFileThatCannotBeKeptAsideIsNotOverwritten) {
    namespace fs = std::filesystem;
    folder.replace(kDomain, "damage");
    fs::permissions(fs::path(folder.path()).parent_path(), fs::perms::all);
    fs::permissions(folder.path(), kReadOnly);
    fs::permissions(folder.path(kDomain), fs::perms::all);
    {
        const Support::OrdinaryFileAccess ordinary;
        EXPECT_EQ(get("A"), "");
        set("A", "new");
        prefs.synchronize();
    }
    EXPECT_EQ(folder.contentOf(kDomain), "damage");
    EXPECT_EQ(log.count("[WARNING] "), 1);
    EXPECT_EQ(log.count("can't be read: "), 1);
}

TEST_F(PrefsTest, WhatCannotBeReadForNowIsNeitherLostNorOverwritten) {
    writeElsewhere(entry("A", "1"));
    EXPECT_EQ(get("A"), "1");
    set("B", "2");
    std::filesystem::rename(folder.path(), folder.path() + ".away");
    std::ofstream(folder.path()) << "no folder";
    prefs.synchronize();
    EXPECT_EQ(get("A") + get("B"), "12");
    EXPECT_EQ(log.count("[WARNING] "), 1);
    std::filesystem::remove(folder.path());
    std::filesystem::rename(folder.path() + ".away", folder.path());
    prefs.synchronize();
    EXPECT_EQ(readElsewhere("A") + readElsewhere("B"), "12");
}

TEST_F(PrefsTest, WaitsTwoSecondsForAProcessThatKeepsTheLock) {
    writeElsewhere(entry("A", "old"));
    const int fd = open((folder.path() + "/.lock").c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0600);
    ASSERT_EQ(flock(fd, LOCK_EX), 0);
    set("A", "new");
    prefs.synchronize();
    EXPECT_NEAR(clock.slept(), 2.0, 1e-6);
    EXPECT_EQ(readElsewhere("A"), "old");
    EXPECT_EQ(log.lines(), Lines({"[WARNING] The preferences in " + folder.path(kDomain) +
                                  " can't be saved: Resource temporarily unavailable"}));
    close(fd);
    prefs.synchronize();
    EXPECT_EQ(readElsewhere("A"), "new");
}

TEST_F(PrefsTest, WritesALinkedFileWhereItIs) {
    writeElsewhere(entry("A", "1"));
    const std::string target = folder.path() + "/linked";
    std::filesystem::rename(folder.path(kDomain), target);
    std::filesystem::create_symlink(target, folder.path(kDomain));
    set("B", "2");
    prefs.synchronize();
    EXPECT_TRUE(std::filesystem::is_symlink(folder.path(kDomain)));
    EXPECT_EQ(readElsewhere("A") + readElsewhere("B"), "12");
}

TEST_F(PrefsTest, NeedsNoPool) {
    LoggingOn on({&gLogPrefs});
    for (int i = 0; i < 2; ++i) {
        set("Key", i ? "a" : "b");
        prefs.synchronize();
        writeElsewhere(entry("Key", "theirs"));
        prefs.synchronize();
        EXPECT_EQ(get("Key"), "theirs");
    }
    EXPECT_EQ(log.count("WARNING"), 0) << testing::PrintToString(log.lines());
}

TEST(ApplicationPrefs, AreThoseOfTheRunningApplication) {
    PreferenceFolder folder;
    folder.replace("com.example.Application",
                   PreferenceFolder::xml(PreferenceFolder::entry("HolmMember", "somebody")));
    ApplicationIdentity::_forget();
    ApplicationIdentity::setIdentifier("com.example.Application");
    Prefs& prefs = Prefs::applicationPrefs();
    EXPECT_EQ(&prefs, &Prefs::applicationPrefs());
    EXPECT_EQ(prefs.getDomain()->utf8(), "com.example.Application");
    const Ref<String> member =
        StringReturner(UntypedPref(prefs, AgentPreferences::kHolmMember.name));
    EXPECT_EQ(member->utf8(), "somebody");
    EXPECT_EQ(Prefs().getDomain()->utf8(), "com.example.Application");
    EXPECT_EQ(Prefs(static_cast<String*>(nullptr)).getDomain()->utf8(), "com.example.Application");
    ApplicationIdentity::_forget();
}
