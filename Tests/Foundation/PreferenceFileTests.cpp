#include "Foundation/PreferenceFile.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/PreferenceFolder.h"
#include "Support/EnvVar.h"
#include "Support/FileAccess.h"
#include "Support/LogCapture.h"
#include "Support/TempDir.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

using namespace Foundation;
using Support::EnvVar;
using Support::TempDir;

using State = PreferenceFile::State;

namespace {

struct NameCase {
    const char* domain;
    const char* file;
};

void PrintTo(const NameCase& c, std::ostream* out) {
    *out << '"' << c.domain << '"';
}

class PreferenceFileNameTest : public testing::TestWithParam<NameCase> {};

class PreferenceFileTest : public testing::Test {
 protected:
    State stateOf(std::string_view content) {
        return PreferenceFile(directory.writeFile("a.plist", content)).read().state;
    }
    bool holds(const std::string& name) {
        return std::filesystem::exists(std::filesystem::symlink_status(directory / name));
    }

    TempDir directory;
    PreferenceFile file{directory / "a.plist"};
};

}  // namespace

TEST_P(PreferenceFileNameTest, IsOneOfTheFolderAndOfNoOtherDomain) {
    const EnvVar folder("XDG_CONFIG_HOME", "/c");
    EXPECT_EQ(PreferenceFile::pathOfDomain(GetParam().domain),
              std::string("/c/orvane/") + GetParam().file);
}

INSTANTIATE_TEST_SUITE_P(
    Domains, PreferenceFileNameTest,
    testing::Values(NameCase{"com.tarnwick.Brisko.RSS", "com.tarnwick.Brisko.RSS.plist"},
                    NameCase{"some-program_2", "some-program_2.plist"},
                    NameCase{"a/b", "a%2Fb.plist"}, NameCase{"../b", "%2E.%2Fb.plist"},
                    NameCase{"..", "%2E..plist"}, NameCase{".hidden", "%2Ehidden.plist"},
                    NameCase{"", "%.plist"}, NameCase{"a%2Fb", "a%252Fb.plist"},
                    NameCase{"a b", "a%20b.plist"}, NameCase{"\xc3\xa9", "%C3%A9.plist"}));

TEST(PreferenceFilePath, IsInTheHomeFolderWithoutAnotherWord) {
    const EnvVar home("HOME", "/home/a");
    const EnvVar folder("XDG_CONFIG_HOME", nullptr);
    EXPECT_EQ(PreferenceFile::pathOfDomain("d"), "/home/a/.config/orvane/d.plist");
}

TEST(PreferenceFilePath, RelativeFoldersAreIgnored) {
    const EnvVar home("HOME", "/home/a");
    for (const char* relative : {"config", "./config", ""}) {
        const EnvVar folder("XDG_CONFIG_HOME", relative);
        EXPECT_EQ(PreferenceFile::pathOfDomain("d"), "/home/a/.config/orvane/d.plist");
    }
}

TEST(PreferenceFilePath, IsInTheUsersRegisteredHomeWhereTheVariableNamesNone) {
    const EnvVar folder("XDG_CONFIG_HOME", nullptr);
    for (const char* home : {static_cast<const char*>(nullptr), "here"}) {
        const EnvVar variable("HOME", home);
        const std::string path = PreferenceFile::pathOfDomain("d");
        EXPECT_TRUE(path.starts_with('/')) << path;
        EXPECT_TRUE(path.ends_with("/.config/orvane/d.plist")) << path;
    }
}

TEST_F(PreferenceFileTest, ReadsWhatItWrote) {
    const Ref<String> value = String::string("a text");
    const Ref<MutableDictionary> values =
        MutableDictionary::dictionary({{Ref<String>(String::string("Key")).get(), value.get()}});
    ASSERT_EQ(file.write(*values), 0);
    const PreferenceFile::Content content = file.read();
    EXPECT_EQ(content.state, State::Read);
    EXPECT_TRUE(content.values->isEqual(values.get()));
}

TEST_F(PreferenceFileTest, NeedsNoPool) {
    Support::LogCapture log;
    const Ref<MutableDictionary> values = MutableDictionary::dictionary();
    ASSERT_EQ(file.write(*values), 0);
    EXPECT_EQ(file.read().state, State::Read);
    EXPECT_EQ(stateOf("<plist>"), State::Damaged);
    EXPECT_EQ(log.lines(), std::vector<std::string>());
}

TEST_F(PreferenceFileTest, IsForTheUserAlone) {
    const Ref<MutableDictionary> values = MutableDictionary::dictionary();
    ASSERT_EQ(file.write(*values), 0);
    struct stat info = {};
    ASSERT_EQ(stat(file.getPath().c_str(), &info), 0);
    EXPECT_EQ(info.st_mode & 07777, 0600u);
}

TEST_F(PreferenceFileTest, MayBeMissing) {
    EXPECT_EQ(file.read().state, State::Missing);
    EXPECT_EQ(PreferenceFile(directory / "none/a.plist").read().state, State::Missing);
}

TEST_F(PreferenceFileTest, IsDamagedIfItIsNoDictionary) {
    EXPECT_EQ(stateOf(""), State::Damaged);
    EXPECT_EQ(stateOf("not XML"), State::Damaged);
    EXPECT_EQ(stateOf("<plist version=\"1.0\"><dict><key>a</key>"), State::Damaged);
    EXPECT_EQ(stateOf("<plist version=\"1.0\"><array/></plist>"), State::Damaged);
    EXPECT_EQ(stateOf("<plist version=\"1.0\"><dict/></plist>"), State::Read);
}

TEST_F(PreferenceFileTest, IsDamagedIfItIsNoFile) {
    directory.makeDirectory("a.plist");
    EXPECT_EQ(file.read().state, State::Damaged);
    const std::string pipe = directory / "pipe";
    ASSERT_EQ(mkfifo(pipe.c_str(), 0600), 0);
    EXPECT_EQ(PreferenceFile(pipe).read().state, State::Damaged);
    const std::string loop = directory / "loop";
    std::filesystem::create_symlink(loop, loop);
    EXPECT_EQ(PreferenceFile(loop).read().state, State::Damaged);
}

TEST_F(PreferenceFileTest, IsDamagedIfItIsNotForThisUser) {
    std::filesystem::permissions(directory.path(), std::filesystem::perms::all);
    std::filesystem::permissions(directory.writeFile("a.plist", ""), std::filesystem::perms::none);
    const Support::OrdinaryFileAccess ordinary;
    const PreferenceFile::Content content = file.read();
    EXPECT_EQ(content.state, State::Damaged);
    EXPECT_EQ(content.reason, "Permission denied");
}

TEST_F(PreferenceFileTest, MayNotBeKnownForNow) {
    directory.writeFile("folder", "no folder");
    const PreferenceFile::Content content = PreferenceFile(directory / "folder/a.plist").read();
    EXPECT_EQ(content.state, State::Failed);
    EXPECT_EQ(content.error, ENOTDIR);
}

TEST_F(PreferenceFileTest, IsSetAsideUnderANameThatNoneHas) {
    for (const char* name : {"a.plist.damaged", "a.plist.damaged-2", "a.plist.damaged-3"}) {
        directory.writeFile("a.plist", name);
        std::string newPath;
        ASSERT_EQ(file.setAside(newPath), 0);
        EXPECT_EQ(newPath, directory / name);
        EXPECT_FALSE(holds("a.plist"));
    }
    EXPECT_EQ(directory.readFile("a.plist.damaged"), "a.plist.damaged");
    EXPECT_EQ(directory.readFile("a.plist.damaged-2"), "a.plist.damaged-2");
}

TEST_F(PreferenceFileTest, WhatCannotBeSetAsideStays) {
    std::string newPath;
    EXPECT_EQ(file.setAside(newPath), ENOENT);
}
