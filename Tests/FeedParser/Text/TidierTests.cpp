#include "FeedParser/Text/Tidier.h"

#include "FeedParser/Text/FeedTidier.h"
#include "FeedParser/Text/HTMLDocumentTidier.h"
#include "FeedParser/Text/HTMLSnippetTidier.h"
#include "FeedParser/Text/TidierAsked.h"
#include "FeedParser/Text/TidyDocument.h"
#include "FeedParser/Text/XMLSnippetTidier.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Logger.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <string>

using namespace Foundation;
using namespace Orvane::FeedParser;

namespace {

constexpr int kUTF8 = 1;
constexpr int kLatin1 = 10;

template <class T>
using Tidy = TidierAsked<T>;

}  // namespace

TEST(Tidier, GivesBackWhatHasNothingToRepair) {
    const AutoreleasePool pool;
    const Ref<HTMLSnippetTidier> tidier =
        Returner<HTMLSnippetTidier>::adopted(new HTMLSnippetTidier);
    for (const std::string text : {"plain text > \xE9 ", ""}) {
        const Ref<Data> data = Data::data(text.data(), text.size());
        const Ref<Data> tidied = tidier->tidy(data.get(), kUTF8, nullptr);
        EXPECT_EQ(tidied.get(), data.get());
    }
    EXPECT_EQ(Ref<Data>(tidier->tidy(nullptr, kUTF8, nullptr)).get(), nullptr);
}

TEST(Tidier, TellsItsClass) {
    EXPECT_STREQ(Ref<Tidier>(Returner<Tidier>::adopted(new FeedTidier))->getClassName(),
                 "FeedTidier");
    EXPECT_STREQ(Ref<Tidier>(Returner<Tidier>::adopted(new HTMLDocumentTidier))->getClassName(),
                 "HTMLDocumentTidier");
    EXPECT_STREQ(Ref<Tidier>(Returner<Tidier>::adopted(new HTMLSnippetTidier))->getClassName(),
                 "HTMLSnippetTidier");
    EXPECT_STREQ(Ref<Tidier>(Returner<Tidier>::adopted(new XMLSnippetTidier))->getClassName(),
                 "XMLSnippetTidier");
}

TEST(Tidier, LogsWhatItDoes) {
    const AutoreleasePool pool;
    const Support::LoggingOn on({&gLogTidier, &gLogTidierVerbose});
    const Support::LogCapture log;
    const Ref<HTMLSnippetTidier> tidier =
        Returner<HTMLSnippetTidier>::adopted(new HTMLSnippetTidier);
    const Ref<Data> data = Data::data("<b>x</b>", 8);
    const Ref<URL> base = URL::url(String::string("http://a/b"));
    const Ref<Data> tidied = tidier->tidy(data.get(), kUTF8, base.get());
    EXPECT_TRUE(log.contains(
        "Tidying 8 bytes (class=HTMLSnippetTidier, encoding=1, baseURL=http://a/b)..."));
    EXPECT_TRUE(log.contains("Tidier input:\n<b>x</b>"));
    EXPECT_TRUE(log.contains("Tidier output:\n<b>x</b>"));
    EXPECT_TRUE(log.contains("...tidied into 8 bytes"));
}

TEST(Tidier, KeepsTheLastLineFeedOfADocumentAlone) {
    EXPECT_TRUE(Tidy<FeedTidier>()("<rss><channel/>").ends_with("</rss>\n"));
    EXPECT_TRUE(Tidy<HTMLDocumentTidier>()("<p>x").ends_with("</html>\n"));
    Tidy<HTMLSnippetTidier> tidy;
    EXPECT_EQ(tidy(tidy("<p>x</p> \n\t\r\n")), "<p>x</p>");
    Tidy<XMLSnippetTidier> tidyXML;
    EXPECT_EQ(tidyXML(tidyXML("<p>x</p> \n")), "<p>x</p>");
}

TEST(Tidier, KeepsCharactersOfEveryEncoding) {
    EXPECT_EQ(Tidy<HTMLSnippetTidier>()("<b>\xE9 &#8364; &eacute;</b>", kLatin1),
              "<b>\xC3\xA9 \xE2\x82\xAC \xC3\xA9</b>");
    EXPECT_EQ(Tidy<HTMLSnippetTidier>()("<b>\xC3\xA9 &#8364;</b>", 0),
              "<b>\xC3\xA9 \xE2\x82\xAC</b>");
}

TEST(Tidier, UsesTheBytesAsTheyAreWhereNothingTellsTheEncoding) {
    for (const int encoding : {0, -1, 6, 99})
        EXPECT_EQ(Tidy<HTMLDocumentTidier>()("<p>\xE9 &eacute;", encoding).find("\xE9 "),
                  Tidy<HTMLDocumentTidier>()("<p>\xE9 &eacute;", encoding).find("<p>") + 3)
            << encoding;
}

TEST(Tidier, TellsOfAnEmptyResultAndGivesIt) {
    const Support::LogCapture log;
    EXPECT_EQ(Tidy<HTMLSnippetTidier>().tidy("<b></b>"), "");
    EXPECT_TRUE(log.contains("Tidy returned 0 bytes of output (from 7 bytes input)!"));
}

namespace {

struct Layout {
    const char* name;
    std::string markup;
    std::string wanted;
};

void PrintTo(const Layout& layout, std::ostream* out) {
    *out << layout.name;
}

std::string words(int count) {
    std::string text;
    for (int i = 0; i < count; ++i)
        text += "word ";
    return text;
}

const Layout kLayouts[] = {
    {"URLsStay", "<a href=\"a b\">c</a>", "<a href=\"a b\">c</a>"},
    {"LinesAreNotWrapped", "<p>" + words(100) + "end", words(100) + "end</p>"},
    {"NothingIsIndented", "<div><p class=\"a\" id=\"b\">c",
     "\n<div>\n<p class=\"a\" id=\"b\">c</p>\n</div>\n"},
    {"TabsAreBlanks", "<pre>a\tb</pre>", "<pre>a b</pre>"},
    {"EntitiesAreNumbers", "<p>a&nbsp;b", "a&#160;b"},
    {"AmpersandsAreEscaped", "<p>a & b", "a &amp; b"},
    {"OddAttributesStay", "<p odd=\"a\">b", "<p odd=\"a\">b</p>"},
    {"OutputIsXHTML", "<p>a<br>b", "<br />"},
    {"NoMarkIsLeft", "<head><title>a</title></head><p>b", "<head>\n<title>a</title>\n</head>"},
};

class Layouts : public testing::TestWithParam<Layout> {};

}  // namespace

TEST_P(Layouts, AreAsTheOptionsSay) {
    const std::string tidied = Tidy<HTMLDocumentTidier>()(GetParam().markup);
    EXPECT_NE(tidied.find(GetParam().wanted), std::string::npos) << tidied;
    EXPECT_EQ(tidied.find('\r'), std::string::npos);
}
INSTANTIATE_TEST_SUITE_P(Of, Layouts, testing::ValuesIn(kLayouts));

namespace {

/// Counts how often its document is set up; can refuse.
class CountingTidier : public FeedTidier {
 public:
    bool setupTidyOptions() override {
        ++setUps;
        return !refuses && FeedTidier::setupTidyOptions();
    }

    int setUps = 0;
    bool refuses = false;
};

}  // namespace

TEST(Tidier, MakesANewDocumentAfterAFailureAlone) {
    const Support::LoggingOn on({&Orvane::gLogParser, &gLogTidier});
    const Support::LogCapture log;
    Tidy<CountingTidier> tidy;
    tidy.tidy("<rss/>");
    tidy.tidy("<rss/>");
    EXPECT_EQ(tidy.tidier().setUps, 1);
    EXPECT_EQ(tidy.tidy("<html><p>x</html>"), "(null)");
    EXPECT_TRUE(
        log.contains("[Parser] Tidy failed, rc=2 (17 bytes, encoding=1, baseURL=(null))..."));
    EXPECT_TRUE(log.contains("[Tidier] Tidy Errors:\n"));
    tidy.tidy("<rss/>");
    EXPECT_EQ(tidy.tidier().setUps, 2);
}

TEST(Tidier, FailsWhereItsOptionsAreRefused) {
    const Support::LoggingOn on({&Orvane::gLogParser});
    const Support::LogCapture log;
    Tidy<CountingTidier> tidy;
    tidy.tidier().refuses = true;
    EXPECT_FALSE(tidy.tidier().open());
    EXPECT_EQ(tidy.tidy("<rss/>"), "(null)");
    EXPECT_EQ(log.count("Tidier: setupTidyOptions failed!"), 2);
    EXPECT_EQ(log.count("[Parser] Not tidied (6 bytes, encoding=1, baseURL=(null)): Tidy can't be "
                        "set up"),
              1);
    EXPECT_FALSE(log.contains("Tidy failed"));
    tidy.tidier().refuses = false;
    EXPECT_TRUE(tidy.tidier().open());
}

TEST(TidyDocument, RefusesOptionsThatThereAreNot) {
    const std::unique_ptr<TidyDocument> document = TidyDocument::create();
    EXPECT_TRUE(document->set("wrap", "0"));
    EXPECT_FALSE(document->set("no-such-option", "yes"));
}

TEST(TidyDocument, BoundsWhatTidyHasToSay) {
    const Support::LoggingOn on({&Orvane::gLogParser});
    const Support::LogCapture log;
    const std::unique_ptr<TidyDocument> document = TidyDocument::create();
    std::string many;
    for (int i = 0; i < 5000; ++i)
        many += "<b></i>";
    document->repair(many, "utf8");
    EXPECT_TRUE(document->hasCutMessages());
    EXPECT_LT(document->getMessages().size(), 20000u);
    EXPECT_EQ(log.count("A document has reached the bound \"kTidyReports\", 100"), 1);
    document->repair("<b></i>", "utf8");
    EXPECT_FALSE(document->hasCutMessages());
}

TEST(Tidier, ReadsContentOfNoKnownEncodingAsWindows) {
    EXPECT_EQ(Tidy<HTMLSnippetTidier>()("<b>\xE9\x80</b>", 0), "<b>\xC3\xA9\xE2\x82\xAC</b>");
    EXPECT_EQ(Tidy<XMLSnippetTidier>()("<b>\xE9\x80</b>", 0), "<b>\xC3\xA9\xE2\x82\xAC</b>");
}

TEST(Tidier, WorksInTheProcessOnlyOnWhatCantTakeMuch) {
    const Ref<Tidier> html = Returner<Tidier>::adopted(new HTMLSnippetTidier);
    const Ref<Tidier> xml = Returner<Tidier>::adopted(new XMLSnippetTidier);
    const Ref<Tidier> feed = Returner<Tidier>::adopted(new FeedTidier);
    EXPECT_TRUE(html->mayTidyHere("<p>x"));
    EXPECT_FALSE(html->mayTidyHere("<table>"));
    EXPECT_TRUE(xml->mayTidyHere("<table>"));
    EXPECT_TRUE(feed->mayTidyHere("<rss>"));
    for (const Ref<Tidier>& tidier : {html, xml, feed})
        EXPECT_FALSE(tidier->mayTidyHere("<p>" + std::string(20000, 'x')));
}
