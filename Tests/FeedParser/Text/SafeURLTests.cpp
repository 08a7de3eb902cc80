#include "FeedParser/Text/SafeURL.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Ref.h"

#include <gtest/gtest.h>

#include <string>

using namespace Foundation;
using namespace Orvane::FeedParser;

namespace {

std::string make(std::string_view url, SafeURL::Use use = SafeURL::Use::Link,
                 const char* base = "http://h/d/f?q") {
    const AutoreleasePool pool;
    const Ref<URL> baseURL = base ? Ref<URL>(URL::url(String::string(base))) : Ref<URL>();
    return SafeURL(baseURL.get()).make(url, use).value_or("(none)");
}

std::string makeSet(std::string_view list) {
    const AutoreleasePool pool;
    const Ref<URL> base = URL::url(String::string("http://h/d/"));
    const SafeURL urls(base.get());
    const std::string made = urls.makeSourceSet(list).value_or("(none)");
    if (made != "(none)") {
        EXPECT_EQ(urls.makeSourceSet(made), made);
    }
    return made;
}

class BadURLs : public testing::TestWithParam<std::string> {};

}  // namespace

TEST_P(BadURLs, AreNotShown) {
    EXPECT_EQ(make(GetParam()), "(none)");
    EXPECT_EQ(make(GetParam(), SafeURL::Use::Image), "(none)");
    EXPECT_EQ(make(GetParam(), SafeURL::Use::Link, nullptr), "(none)");
}

INSTANTIATE_TEST_SUITE_P(
    Such, BadURLs,
    testing::Values("javascript:x", "JaVaScRiPt:x", " \t\n javascript:x", "java\nscript:x",
                    "java\tscript\r:x", "javascript\x0B:x", "\x01javascript:x", "\x7Fjavascript:x",
                    "jav\x07"
                    "ascript:x",
                    "\xC2\xA0javascript:x", "\xE2\x80\x8Bjavascript:x", "java script:x",
                    "vbscript:x", "data:text/html,x", "data:text/html;base64,x", "data:,x",
                    "data:image/svg+xml;base64,AAAA", "data:image/png,<svg>",
                    "data:image/png;base64,AA,x", "livescript:x", "mocha:x", "file:///etc/passwd",
                    "about:blank", "blob:x", "view-source:x", "res://x", "jar:x", "x:y", ":x",
                    "javascript&colon;x:",
                    "\xEF\xBD\x8A"
                    "avascript:x"));

TEST(SafeURL, KeepsWhatOnlyLeadsSomewhere) {
    EXPECT_EQ(make("HTTP://a/b?c#d"), "HTTP://a/b?c#d");
    EXPECT_EQ(make(" https://a/\n b "), "https://a/ b");
    EXPECT_EQ(make("mailto:a@b"), "mailto:a@b");
    EXPECT_EQ(make("feed:http://a/"), "feed:http://a/");
    EXPECT_EQ(make("mailto:a@b", SafeURL::Use::Image), "(none)");
}

TEST(SafeURL, KeepsPicturesInThePlaceOfPicturesAlone) {
    EXPECT_EQ(make("data:image/PNG;base64,AA+/=", SafeURL::Use::Image),
              "data:image/PNG;base64,AA+/=");
    EXPECT_EQ(make("data:image/png;base64,AA+/="), "(none)");
}

TEST(SafeURL, MakesRelativeOnesAbsolute) {
    EXPECT_EQ(make("a.html"), "http://h/d/a.html");
    EXPECT_EQ(make("/a?b#c"), "http://h/a?b#c");
    EXPECT_EQ(make("../a"), "http://h/a");
    EXPECT_EQ(make("?x"), "http://h/d/f?x");
    EXPECT_EQ(make("#x"), "http://h/d/f?q#x");
    EXPECT_EQ(make("//g/x"), "http://g/x");
    EXPECT_EQ(make(""), "http://h/d/f?q");
    EXPECT_EQ(make("a:b/c"), "(none)");
    EXPECT_EQ(make("./a:b"), "http://h/d/a:b");
    EXPECT_EQ(make("a/b:c"), "http://h/d/a/b:c");
    EXPECT_EQ(make("javascript%3Ax"), "http://h/d/javascript%3Ax");
}

TEST(SafeURL, LeavesThemWhereThereIsNoBase) {
    EXPECT_EQ(make("a.html", SafeURL::Use::Link, nullptr), "a.html");
    EXPECT_EQ(make("a", SafeURL::Use::Link, "file:///d/f"), "(none)");
}

TEST(SafeURL, ReadsListsOfPictures) {
    EXPECT_EQ(makeSet("a.gif"), "http://h/d/a.gif");
    EXPECT_EQ(makeSet(" a.gif 1.5x,\n/b.gif  640w , c.gif,"),
              "http://h/d/a.gif 1.5x, http://h/b.gif 640w, http://h/d/c.gif");
    EXPECT_EQ(makeSet("javascript:x 2x, a.gif 2x"), "http://h/d/a.gif 2x");
    EXPECT_EQ(makeSet("a.gif onload"), "http://h/d/a.gif");
    EXPECT_EQ(makeSet("javascript:x"), "(none)");
    EXPECT_EQ(makeSet(" , "), "(none)");
}
