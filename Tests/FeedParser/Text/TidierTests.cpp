#include "FeedParser/Text/Tidier.h"

#include "FeedParser/Text/FeedTidier.h"
#include "FeedParser/Text/HTMLDocumentTidier.h"
#include "FeedParser/Text/HTMLSnippetTidier.h"
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

/// A tidier, asked in texts.
template <class T>
class Tidy {
 public:
    /// The tidied markup; "(null)" for a failure.
    std::string operator()(const std::string& markup, int encoding = kUTF8) {
        const AutoreleasePool pool;
        const Ref<Data> data = Data::data(markup.data(), markup.size());
        const Ref<Data> tidied = mTidier->tidy(data.get(), encoding, nullptr);
        return tidied ? std::string(tidied->view()) : "(null)";
    }

 private:
    Ref<T> mTidier = Returner<T>::adopted(new T);
};

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
    const Ref<Data> data = Data::data("<b>x", 4);
    const Ref<URL> base = URL::url(String::string("http://a/b"));
    const Ref<Data> tidied = tidier->tidy(data.get(), kUTF8, base.get());
    EXPECT_TRUE(log.contains(
        "Tidying 4 bytes (class=HTMLSnippetTidier, encoding=1, baseURL=http://a/b)..."));
    EXPECT_TRUE(log.contains("Tidier input:\n<b>x"));
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
