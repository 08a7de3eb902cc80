#include "Foundation/URL.h"

#include "Foundation/URLTexts.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <random>

using namespace Foundation;

namespace {

class URLDisguise : public testing::TestWithParam<const char*> {};

}  // namespace

TEST(LenientURL, GivesNullForAnEmptyText) {
    EXPECT_EQ(lenient("").get(), nullptr);
}

TEST(LenientURL, LeavesAGoodURLAlone) {
    Support::LogCapture log;
    const Support::LoggingOn on({});
    EXPECT_EQ(text(lenient("http://a/%20#b")->getString()), "http://a/%20#b");
    EXPECT_TRUE(log.lines().empty());
}

TEST(LenientURL, EscapesWhatAURLCannotHoldAndSaysSo) {
    Support::LogCapture log;
    const Support::LoggingOn on({});
    EXPECT_EQ(text(lenient("http://my host/b")->getString()), "http://my%20host/b");
    EXPECT_EQ(log.lines(), std::vector<std::string>{
                               "lenientURLFromString: Cleaning up bad URL string <http://my host/b>"
                               ", resulting in <http://my%20host/b>"});
    EXPECT_EQ(text(lenient("http://my host/b")->getHost()), "my%20host");
}

TEST(LenientURL, GivesNullForWhatEscapesCannotMend) {
    Support::LogCapture log;
    const Support::LoggingOn on({});
    EXPECT_EQ(lenient("http://a:b c/").get(), nullptr);
    ASSERT_EQ(log.lines().size(), 2u);
    EXPECT_EQ(log.lines()[1], "lenientURLFromString: Unable to parse URL string <http://a:b c/>");
}

TEST(LenientURL, MakesTheResultAbsolute) {
    const Support::LogCapture log;
    const Ref<URL> base = strict("http://a/b/c");
    EXPECT_EQ(text(lenient("../d e", base)->getString()), "http://a/d%20e");
    EXPECT_EQ(text(lenient("http://x/../y", base)->getString()), "http://x/../y");
    EXPECT_EQ(text(lenient("d")->getString()), "d");
}

TEST(LenientURL, KeepsTheRelativeFormWhereTheBaseHasNoScheme) {
    Support::LogCapture log;
    const Support::LoggingOn on({});
    const Ref<URL> base = strict("/a/b");
    EXPECT_EQ(text(lenient("c", base)->getString()), "c");
    EXPECT_EQ(log.lines(),
              std::vector<std::string>{
                  "lenientURLFromString: Unable to make <c> absolute, relative to </a/b>"});
}

TEST(LenientURL, KeepsEscapesAndStructureAndEscapesTheRest) {
    const Support::LogCapture log;
    const std::pair<const char*, const char*> cases[] = {
        {"http://a/%41%", "http://a/%41%25"},
        {"http://a/100%zz", "http://a/100%25zz"},
        {"http://a/\xc3\xa4?\xc3\xa4#\xc3\xa4", "http://a/%C3%A4?%C3%A4#%C3%A4"},
        {"http://\xc3\xa4.b/", "http://%C3%A4.b/"},
        {"http://a/b#c#d", "http://a/b#c%23d"},
        {"http://a/[b]?c[]=1", "http://a/[b]?c[]=1"},
        {"http://u@[::1]:8/a b[", "http://u@[::1]:8/a%20b["},
        {"//[::1]/a b", "//[::1]/a%20b"},
        {"http://u[@a b/[", "http://u%5B@a%20b/["},
        {"http://u@mail.x:p@a/", "http://u%40mail.x:p@a/"},
        {"http://a\\b/", "http://a%5Cb/"},
        {"http://a/\"<>{}|\\^`", "http://a/%22%3C%3E%7B%7D%7C%5C%5E%60"},
        {"http://a/b\tc\nd", "http://a/b%09c%0Ad"},
        {"http://a/b@c@d e", "http://a/b@c@d%20e"},
        {"mailto:a b@c@d", "mailto:a%20b@c@d"},
    };
    for (const auto& [given, wanted] : cases) {
        const Ref<URL> url = lenient(given);
        ASSERT_NE(url.get(), nullptr) << given;
        EXPECT_EQ(text(url->getString()), wanted);
    }
}

// Sanitizing

TEST(SanitizedURL, RefusesSchemesThatRunScriptsInAnyCase) {
    for (const char* script : {"javascript:a()", "JavaScript:a()", "JAVASCRIPT:a()", "script:a",
                               "Script:a", "vbscript:a", "VBScript:a", "jAvAsCrIpT://a/b"}) {
        EXPECT_EQ(Ref<URL>(strict(script)->getSanitizedURL()).get(), nullptr) << script;
    }
}

TEST(SanitizedURL, GivesAURLWithAnotherSchemeAsItStands) {
    for (const char* good :
         {"mailto:a@b", "http://a/", "javascripts:a", "java:script", "file:///a"}) {
        const Ref<URL> url = strict(good);
        EXPECT_EQ(Ref<URL>(url->getSanitizedURL()).get(), url.get()) << good;
    }
}

TEST(SanitizedURL, RefusesAURLWithoutAScheme) {
    EXPECT_EQ(Ref<URL>(strict("a/b")->getSanitizedURL()).get(), nullptr);
    EXPECT_EQ(Ref<URL>(strict("//a/b")->getSanitizedURL()).get(), nullptr);
}

TEST_P(URLDisguise, NeverBecomesAnActiveScheme) {
    const Support::LogCapture log;
    const Ref<URL> page = strict("http://a/b");
    const Ref<URL> fragment = strict("b");
    const Ref<URL> script = strict("javascript:x");
    for (URL* base : {static_cast<URL*>(nullptr), page.get(), fragment.get(), script.get()}) {
        const Ref<URL> url = lenient(GetParam(), base);
        const Ref<URL> offered = URL::getSanitizedURL(url);
        if (!offered) continue;
        EXPECT_TRUE(offered->isScheme("http")) << OVFormat("%@", offered);
        EXPECT_EQ(text(offered->getHost()), "a");
    }
}
INSTANTIATE_TEST_SUITE_P(
    All, URLDisguise,
    testing::Values("javascript:alert(1)", " javascript:alert(1)", "\tjavascript:alert(1)",
                    "\x01javascript:alert(1)", "java\nscript:alert(1)", "java\tscript:alert(1)",
                    "java\rscript:alert(1)", "javascript :alert(1)", "javascript\n:alert(1)",
                    "JAVASCRIPT\t:alert(1)", "%6Aavascript:alert(1)", "%6aavascript:alert 1",
                    "javascript%3Aalert(1)", "java%0Ascript:alert(1)", "./javascript:alert(1)",
                    "/./javascript:alert(1)", "../javascript:alert 1", "\xe2\x80\x8bjavascript:a",
                    "\xef\xbb\xbfjavascript:a", "\xc2\xa0javascript:a",
                    "javascript\xef\xbc\x9a"
                    "a",
                    "java\\script:a", "<javascript:a>", "\"javascript:a\"", "'javascript:a'",
                    "javascript&colon;a", "javascript&#58;a", "#javascript:a", "?javascript:a",
                    "ja\xc4\xb1vascript:a", "v\nbscript:a", "\nscript:a"));

// Any text

TEST(LenientURL, MakesOnlyURLsThatHoldTogetherFromRandomTexts) {
    constexpr unsigned kSeed = 20260101;
    SCOPED_TRACE(kSeed);
    std::mt19937 random(kSeed);
    constexpr std::string_view kLetters = "ab:/?#[]@%2F.. \\j\t:/.";
    const auto any = [&] {
        std::string spelling;
        for (auto length = random() % 12; length > 0; --length) {
            spelling += kLetters[random() % kLetters.size()];
        }
        return spelling;
    };
    Support::LogCapture log;
    for (int i = 0; i < 20000; ++i) {
        log.clear();
        const std::string baseText = any(), spelling = any();
        const Ref<URL> base = strict(baseText);
        const Ref<URL> url = lenient(spelling, base);
        if (!url) continue;
        const std::string absolute = text(url->getAbsoluteString());
        const Ref<URL> again = strict(absolute);
        ASSERT_NE(again.get(), nullptr) << baseText << " and " << spelling << ": " << absolute;
        EXPECT_EQ(text(again->getScheme()), text(url->getScheme())) << absolute;
        EXPECT_EQ(text(again->getHost()), text(url->getHost())) << absolute;
        const Ref<URL> alone = strict(spelling);
        if (!base || !alone || alone->hasScheme()) continue;
        EXPECT_EQ(text(again->getScheme()), text(base->getScheme()))
            << baseText << " and " << spelling << ": " << absolute;
    }
}
