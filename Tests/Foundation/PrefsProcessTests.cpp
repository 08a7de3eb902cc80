#include "Foundation/PreferenceFolder.h"
#include "Foundation/UntypedPref.h"
#include "Support/ChildProcess.h"
#include "Support/EnvVar.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <thread>

using namespace Foundation;
using Support::ChildResult;
using Support::EnvVar;

// What one process sees of another's preferences, and what the log decides by them once for a
// process: see PrefsHelper.cpp.

namespace {

constexpr const char* kDomain = "com.example.Test";
constexpr const char* kApplication = "com.example.Application";

ChildResult runHelper(std::vector<std::string> words) {
    words.insert(words.begin(), PREFS_HELPER);
    ChildResult result = Support::runChild(words);
    EXPECT_EQ(result.status, 0) << result.err;
    return result;
}

class PrefsProcess : public testing::Test {
 protected:
    std::string get(Prefs& prefs, const char* key) {
        const Ref<String> text = StringReturner(UntypedPref(prefs, key));
        return text->utf8();
    }

    PreferenceFolder folder;
};

/// An application with preferences of the log, and nothing in the environment.
class LoggerPreferences : public PrefsProcess {
 protected:
    void hold(const std::vector<std::string>& switches) {
        std::string entries;
        for (const std::string& name : switches) {
            entries += "<key>" + name + "</key><true/>";
        }
        folder.replace(kApplication, PreferenceFolder::xml(entries));
    }
    /// Which of the facilities a new process has on, as "101", after `words` were carried out.
    std::string areOn(const std::vector<std::string>& facilities,
                      std::vector<std::string> words = {}) {
        words.insert(words.begin(), {"as", kApplication});
        for (const std::string& name : facilities) {
            words.insert(words.end(), {"on", name});
        }
        std::string out = runHelper(words).out;
        std::erase(out, '\n');
        return out;
    }

    EnvVar mLog{"OVLog", nullptr};
    EnvVar mSQL{"OVLogSQL", nullptr};
};

}  // namespace

TEST_F(PrefsProcess, SeesAnothersChangeOnceItSynchronizes) {
    Prefs prefs(kDomain);
    EXPECT_EQ(get(prefs, "Key"), "");
    runHelper({"set", kDomain, "Key", "theirs"});
    EXPECT_EQ(get(prefs, "Key"), "");
    prefs.synchronize();
    EXPECT_EQ(get(prefs, "Key"), "theirs");
    runHelper({"remove", kDomain, "Key"});
    prefs.synchronize();
    EXPECT_FALSE(UntypedPref(prefs, "Key").exists());
}

TEST_F(PrefsProcess, UndoesNothingThatAnotherChangedMeanwhile) {
    Prefs prefs(kDomain);
    UntypedPref(prefs, "Mine") = true;
    runHelper({"set", kDomain, "Theirs", "1"});
    prefs.synchronize();
    EXPECT_EQ(get(prefs, "Theirs"), "1");
    EXPECT_EQ(runHelper({"get", kDomain, "Theirs", "get", kDomain, "Mine"}).out, "1\n1\n");
}

TEST_F(PrefsProcess, ManyThatWriteAtATimeLoseNoChange) {
    constexpr int kProcesses = 4;
    std::vector<std::thread> writers;
    writers.reserve(kProcesses);
    for (int i = 0; i < kProcesses; ++i) {
        writers.emplace_back([i] {
            runHelper({"count", kDomain, "Key" + std::to_string(i), "15"});
        });
    }
    for (std::thread& writer : writers) {
        writer.join();
    }
    for (int i = 0; i < kProcesses; ++i) {
        EXPECT_EQ(folder.textOf(kDomain, "Key" + std::to_string(i)), "15");
    }
    EXPECT_EQ(folder.names(), std::set<std::string>({"com.example.Test.plist"}));
}

TEST_F(PrefsProcess, FindsWhatAnotherLeftThatFoundTheFileDamaged) {
    folder.replace(kDomain, "damage");
    const ChildResult result = runHelper({"set", kDomain, "Key", "value"});
    EXPECT_NE(result.err.find("are kept as"), std::string::npos) << result.err;
    EXPECT_EQ(folder.textOf(kDomain, "Key"), "value");
    EXPECT_EQ(folder.contentOf(kDomain).find("damage"), std::string::npos);
    EXPECT_EQ(runHelper({"get", kDomain, "Key"}).err, "");
}

TEST_F(LoggerPreferences, AFacilitysAloneTurnsNothingOn) {
    hold({"OVLogSQL"});
    EXPECT_EQ(areOn({"SQL", ""}), "00");
}

TEST_F(LoggerPreferences, TheGeneralOneTurnsTheGeneralLogOn) {
    hold({"OVLog"});
    EXPECT_EQ(areOn({"", "SQL"}), "10");
}

TEST_F(LoggerPreferences, BothTurnAFacilityOn) {
    hold({"OVLog", "OVLogSQL"});
    EXPECT_EQ(areOn({"SQL", "Feed", ""}), "101");
}

TEST_F(LoggerPreferences, TheEnvironmentComesBeforeThem) {
    hold({"OVLog", "OVLogSQL"});
    {
        const EnvVar sql("OVLogSQL", "NO");
        EXPECT_EQ(areOn({"SQL", ""}), "01");
    }
    const EnvVar log("OVLog", "0");
    EXPECT_EQ(areOn({"SQL", ""}), "00");
}

TEST_F(LoggerPreferences, EitherMayBeInTheEnvironment) {
    hold({"OVLogSQL"});
    const EnvVar log("OVLog", "1");
    EXPECT_EQ(areOn({"SQL", "Feed"}), "10");
}

TEST_F(LoggerPreferences, AreThoseOfTheApplicationThatRuns) {
    folder.replace("com.example.Other", PreferenceFolder::xml("<key>OVLog</key><true/>"));
    EXPECT_EQ(areOn({""}), "0");
}

TEST_F(LoggerPreferences, TheGeneralOneIsReadOnceForTheProcess) {
    EXPECT_EQ(areOn({"", "SQL"}, {"on", "", "assign", "OVLog", "assign", "OVLogSQL"}), "000");
}

TEST_F(LoggerPreferences, AFacilitysIsReadAtItsFirstUse) {
    hold({"OVLog"});
    EXPECT_EQ(areOn({"SQL", "Feed"}, {"on", "Feed", "assign", "OVLogSQL", "assign", "OVLogFeed"}),
              "010");
}

TEST_F(LoggerPreferences, ThePreferencesOwnFacilityMaySettleItselfByThem) {
    hold({"OVLog", "OVLogPrefs"});
    EXPECT_EQ(areOn({"Prefs", ""}), "11");
    const std::string log = runHelper({"as", kApplication, "assign", "Switch"}).err;
    EXPECT_NE(log.find("[Prefs] Set Switch = 1"), std::string::npos) << log;
}

TEST_F(LoggerPreferences, ADamagedFileTurnsNothingOn) {
    folder.replace(kApplication, "damage");
    EXPECT_EQ(areOn({"", "SQL"}), "00");
}
