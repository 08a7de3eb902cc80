#include "Foundation/ApplicationIdentity.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/DesktopLaunch.h"
#include "Support/EnvVar.h"
#include "Support/LogCapture.h"

#include <gio/gio.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <memory>

using namespace Foundation;
using Support::EnvVar;
using Support::LogCapture;

namespace {

/// A process that nothing tells who it is but its program's name, "some-program".
class ApplicationIdentityTest : public testing::Test {
 protected:
    ApplicationIdentityTest() {
        g_set_prgname("some-program");
        ApplicationIdentity::_forget();
    }
    ~ApplicationIdentityTest() override {
        g_application_set_default(nullptr);
        g_set_prgname(mProgramName.c_str());
        ApplicationIdentity::_forget();
    }

    void beGIOApplication(const char* identifier) {
        mApplication.reset(g_application_new(identifier, G_APPLICATION_DEFAULT_FLAGS));
        g_application_set_default(mApplication.get());
    }
    void beLaunchedBy(const char* desktopFile, int pid = getpid()) {
        mFile.emplace(DesktopLaunch::kFileVariable, desktopFile);
        mPID.emplace(DesktopLaunch::kProcessVariable, std::to_string(pid).c_str());
    }

    std::string mProgramName = g_get_prgname() ? g_get_prgname() : "foundation_tests";
    std::optional<EnvVar> mFile{std::in_place, DesktopLaunch::kFileVariable, nullptr};
    std::optional<EnvVar> mPID{std::in_place, DesktopLaunch::kProcessVariable, nullptr};
    std::unique_ptr<GApplication, void (*)(gpointer)> mApplication{nullptr, g_object_unref};
};

}  // namespace

TEST_F(ApplicationIdentityTest, IsTheProgramsNameIfNothingElseIsKnown) {
    EXPECT_EQ(ApplicationIdentity::getIdentifier(), "some-program");
}

TEST_F(ApplicationIdentityTest, IsTheDesktopFileThatLaunchedTheProcess) {
    beLaunchedBy("/usr/share/applications/org.example.Reader.desktop");
    EXPECT_EQ(ApplicationIdentity::getIdentifier(), "org.example.Reader");
}

TEST_F(ApplicationIdentityTest, IsNotTheDesktopFileThatLaunchedAnAncestor) {
    beLaunchedBy("/usr/share/applications/org.example.Terminal.desktop", getppid());
    EXPECT_EQ(ApplicationIdentity::getIdentifier(), "some-program");
}

TEST_F(ApplicationIdentityTest, IsTheIDOfGIOsApplicationBeforeTheDesktopFile) {
    beLaunchedBy("/usr/share/applications/org.example.Other.desktop");
    beGIOApplication("org.example.Reader");
    EXPECT_EQ(ApplicationIdentity::getIdentifier(), "org.example.Reader");
}

TEST_F(ApplicationIdentityTest, AGIOApplicationWithoutAnIDSaysNothing) {
    beLaunchedBy("/usr/share/applications/org.example.Other.desktop");
    beGIOApplication(nullptr);
    EXPECT_EQ(ApplicationIdentity::getIdentifier(), "org.example.Other");
}

TEST_F(ApplicationIdentityTest, IsWhatTheProgramSetBeforeAllElse) {
    beGIOApplication("org.example.Reader");
    ApplicationIdentity::setIdentifier("org.example.Own");
    EXPECT_EQ(ApplicationIdentity::getIdentifier(), "org.example.Own");
}

TEST_F(ApplicationIdentityTest, StaysWhatItWasAtItsFirstUse) {
    LogCapture log;
    EXPECT_EQ(ApplicationIdentity::getIdentifier(), "some-program");
    beGIOApplication("org.example.Reader");
    EXPECT_EQ(ApplicationIdentity::getIdentifier(), "some-program");
    EXPECT_THROW(ApplicationIdentity::setIdentifier("org.example.Own"), AssertionFailure);
    EXPECT_NO_THROW(ApplicationIdentity::setIdentifier("some-program"));
}

TEST_F(ApplicationIdentityTest, MustBeAText) {
    LogCapture log;
    EXPECT_THROW(ApplicationIdentity::setIdentifier(""), AssertionFailure);
    EXPECT_THROW(ApplicationIdentity::setIdentifier("\xff"), AssertionFailure);
}

TEST_F(ApplicationIdentityTest, IsValidUTF8WhateverTheFileIsCalled) {
    beLaunchedBy("/home/a/caf\xe9.desktop");
    EXPECT_EQ(ApplicationIdentity::getIdentifier(), "caf\xef\xbf\xbd");
}

TEST(DesktopLaunch, TakesTheFilesNameWithoutItsSuffix) {
    EXPECT_EQ(DesktopLaunch::identifier("/a/b/org.example.Reader.desktop", "12", 12),
              "org.example.Reader");
    EXPECT_EQ(DesktopLaunch::identifier("reader.desktop", "12", 12), "reader");
    EXPECT_EQ(DesktopLaunch::identifier("/a/reader", "12", 12), "reader");
}

TEST(DesktopLaunch, BelievesOnlyWhatIsSaidOfTheProcessItself) {
    EXPECT_EQ(DesktopLaunch::identifier("/a/reader.desktop", "11", 12), "");
    EXPECT_EQ(DesktopLaunch::identifier("/a/reader.desktop", "", 12), "");
    EXPECT_EQ(DesktopLaunch::identifier("", "12", 12), "");
}
