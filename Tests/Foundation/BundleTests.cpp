#include "Foundation/Bundle.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Foundation/ErrorTexts.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"
#include "Support/Language.h"
#include "Support/LogCapture.h"
#include "Support/TempDir.h"

#include <Orvane/OVErrorCode.h>
#include <gtest/gtest.h>

using namespace Foundation;
using Support::Language;
using Support::LogCapture;
using Support::TempDir;

namespace {

/// A string that lives as long as the expression; null for null.
class Text {
 public:
    Text(const char* utf8) : mString(String::string(utf8)) {}
    operator const String*() const { return mString.get(); }

 private:
    Ref<String> mString;
};

class BundleTest : public testing::Test {
 protected:
    BundleTest() {
        mDir.makeDirectory("share");
        mDir.makeDirectory("share/app");
        mDir.makeDirectory("share/app/pages");
        mDir.writeFile("share/outside.txt", "outside");
        mDir.writeFile("share/app/feed.html", "<html>");
        mDir.writeFile("share/app/README", "read me");
        mDir.writeFile("share/app/bad.txt", "\xff");
        mDir.writeFile("share/app/pages/a b.js", "script");
        mBundle = Bundle::bundle(mDir / "share/app", "app");
    }

    /// The path of a resource below the temporary directory; "none" if there is none.
    std::string find(const char* name, const char* type, const char* directory) {
        const Ref<URL> url = mBundle->getOptResourceURL(Text(name), Text(type), Text(directory));
        if (!url) return "none";
        return url->getFileSystemRepresentation().substr(mDir.path().string().size() + 1);
    }

    TempDir mDir;
    Ref<Bundle> mBundle;
};

}  // namespace

TEST_F(BundleTest, FindsAResource) {
    EXPECT_EQ(find("feed", "html", nullptr), "share/app/feed.html");
    EXPECT_EQ(find("feed.html", nullptr, nullptr), "share/app/feed.html");
    EXPECT_EQ(find("README", nullptr, nullptr), "share/app/README");
    EXPECT_EQ(find("a b", "js", "pages"), "share/app/pages/a b.js");
}

TEST_F(BundleTest, FindsNoneThatThereIsNot) {
    EXPECT_EQ(find("feed", "txt", nullptr), "none");
    EXPECT_EQ(find("feed", "html", "pages"), "none");
    EXPECT_EQ(find("", nullptr, nullptr), "none");
    EXPECT_EQ(find(nullptr, nullptr, nullptr), "none");
}

TEST_F(BundleTest, LeadsNowhereElse) {
    EXPECT_EQ(find("outside", "txt", ".."), "none");
    EXPECT_EQ(find("../outside", "txt", nullptr), "none");
    EXPECT_EQ(find("pages/../../outside", "txt", nullptr), "none");
    EXPECT_EQ(find("..", nullptr, nullptr), "none");
}

TEST_F(BundleTest, RequiresAResourceThatIsAskedForByItsURL) {
    const LogCapture log;
    const Ref<URL> url = mBundle->getResourceURL(Text("feed"), Text("html"), nullptr);
    EXPECT_TRUE(url->getFileSystemRepresentation().ends_with("share/app/feed.html"));
    EXPECT_THROW(Ref<URL>(mBundle->getResourceURL(Text("none"), Text("html"), nullptr)),
                 AssertionFailure);
    EXPECT_TRUE(log.contains("No resource none.html in "));
}

TEST_F(BundleTest, LoadsResources) {
    const LogCapture log;
    EXPECT_EQ(Ref<String>(mBundle->loadResourceString(Text("README"), nullptr))->utf8(), "read me");
    EXPECT_EQ(Ref<Data>(mBundle->loadResourceData(Text("bad"), Text("txt")))->view(), "\xff");
    EXPECT_THROW(Ref<String>(mBundle->loadResourceString(Text("bad"), Text("txt"))),
                 AssertionFailure);
    EXPECT_THROW(Ref<Data>(mBundle->loadResourceData(Text("none"), nullptr)), AssertionFailure);
}

TEST_F(BundleTest, HasAURLOfADirectory) {
    const Ref<URL> url = mBundle->getBundleURL();
    EXPECT_TRUE(url->hasDirectoryPath());
    EXPECT_EQ(url->getFileSystemRepresentation(), mDir / "share/app");
}

TEST_F(BundleTest, OfSomebodyElseHasNoEnglishTexts) {
    EXPECT_EQ(mBundle->getLocalizedText("TodayFmt"), "TodayFmt");
}

TEST_F(BundleTest, FindsItsTranslations) {
    const Ref<Bundle> sample = Bundle::bundle(SAMPLE_RESOURCES, "sample");
    const Language german("de");
    EXPECT_EQ(Ref<String>(sample->getLocalizedString(Text("key"), nullptr))->utf8(),
              "ohne Tabelle");
    EXPECT_EQ(Ref<String>(sample->getLocalizedString(Text("key"), Text("Localizable")))->utf8(),
              "ohne Tabelle");
    EXPECT_EQ(Ref<String>(sample->getLocalizedString(Text("key"), Text("Other")))->utf8(),
              "in der Tabelle");
    EXPECT_EQ(Ref<String>(sample->getLocalizedString(Text("none"), Text("Other")))->utf8(), "none");
    EXPECT_EQ(Ref<String>(sample->getLocalizedString(nullptr, nullptr)).get(), nullptr);
    EXPECT_EQ(sample->getLocalizedPlural("%u feed", "%u feeds", 3), "%u Feeds (Mehrzahl)");
}

TEST(Bundle, OfTheFrameworkIsThatOfTheVariable) {
    const AutoreleasePool pool;
    Bundle* bundle = Bundle::frameworkBundle();
    EXPECT_EQ(bundle, Bundle::frameworkBundle());
    const std::string directory = Ref<URL>(bundle->getBundleURL())->getFileSystemRepresentation();
    EXPECT_EQ(directory, std::getenv("ORVANE_RESOURCES"));
}

TEST(Bundle, OfTheFrameworkFallsBackOnEnglishAndThenOnTheKey) {
    const AutoreleasePool pool;
    Bundle* bundle = Bundle::frameworkBundle();
    EXPECT_EQ(bundle->getLocalizedText("%.1f KB (0.1)"), "%.1f KB");
    EXPECT_EQ(bundle->getLocalizedText("no such key"), "no such key");
    EXPECT_EQ(bundle->getLocalizedText("%.1f KB (0.1)", "Other"), "%.1f KB (0.1)");
    EXPECT_EQ(bundle->getLocalizedText(""), "");
    EXPECT_EQ(bundle->getLocalizedPlural("%u feed", "%u feeds", 1), "%u feed");
    EXPECT_EQ(bundle->getLocalizedPlural("%u feed", "%u feeds", 0), "%u feeds");
}

TEST(Bundle, OfTheFrameworkSpeaksGerman) {
    Bundle* bundle = Bundle::frameworkBundle();
    const Language german("de");
    EXPECT_EQ(bundle->getLocalizedText("OVNotAFeedErrorDescription"), "Das ist kein Feed.");
    EXPECT_EQ(bundle->getLocalizedText("%.0f bytes"), "%.0f Byte");
    EXPECT_EQ(bundle->getLocalizedText("no such key"), "no such key");
    EXPECT_EQ(localizedText("TodayFmt"), "'Heute', HH:mm");
    EXPECT_EQ(describeURLError(OVURLErrorTooManyRedirects), "Der Server leitet zu oft um.");
}
