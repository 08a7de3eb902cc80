#include "Model/ContentCore.h"

#include "FeedParser/Text/HTMLSnippetTidier.h"
#include "Model/ModelTest.h"
#include "Model/Values.h"

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;

namespace {

ContentCore* content(const char* type, const char* data) {
    ContentCore* row = make<ContentCore>();
    if (type) row->mMIMEType.setValue(str(type));
    if (data) row->mData.setValue(bytes(data));
    return row;
}

class ContentCoreTest : public ModelTest {};

struct TypeCase {
    const char* type;
    bool isXML, isPlainText, isHTML, isText;
    const char* atomType;
};

class ContentTypeTest : public ContentCoreTest, public testing::WithParamInterface<TypeCase> {};

INSTANTIATE_TEST_SUITE_P(
    Types, ContentTypeTest,
    testing::Values(TypeCase{nullptr, false, true, false, true, "text"},
                    TypeCase{"text/plain", false, true, false, true, "text"},
                    TypeCase{"Text/Plain; charset=utf-8", false, true, false, true, "text"},
                    TypeCase{"text/html", false, false, true, true, "html"},
                    TypeCase{"text/html; charset=utf-8", false, false, true, true, "html"},
                    TypeCase{"application/xhtml+xml", true, false, true, false, "xhtml"},
                    TypeCase{"image/svg+xml", true, false, false, false, "image/svg+xml"},
                    TypeCase{"text/xml", true, false, false, true, "text/xml"},
                    TypeCase{"text/css", false, false, false, true, "text/css"},
                    TypeCase{"image/png", false, false, false, false, "image/png"}));

}  // namespace

TEST_P(ContentTypeTest, SaysWhatTheTypeSays) {
    const TypeCase& given = GetParam();
    const Ref<ContentCore> row = content(given.type, "x");
    EXPECT_EQ(row->isXMLString(), given.isXML);
    EXPECT_EQ(row->isPlainTextString(), given.isPlainText);
    EXPECT_EQ(row->isHTMLString(), given.isHTML);
    EXPECT_EQ(row->isTextString(), given.isText);
    EXPECT_EQ(textOf(row->getAtomType()), given.atomType);
}

TEST_F(ContentCoreTest, HashesItsData) {
    EXPECT_EQ(textOf(content("text/html", "abc")->getComputedHash()),
              "a9993e364706816aba3e25717850c26c9cd0d89d");
    EXPECT_EQ(textOf(content("text/html", nullptr)->getComputedHash()), "(null)");
}

TEST_F(ContentCoreTest, MoreDataIsBetter) {
    const Ref<ContentCore> none = content("text/html", nullptr);
    const Ref<ContentCore> empty = content("text/html", "");
    const Ref<ContentCore> two = content("text/html", "ab");
    const Ref<ContentCore> three = content("text/html", "abc");
    EXPECT_TRUE(two->isBetterThan(nullptr));
    EXPECT_TRUE(two->isBetterThan(none.get()));
    EXPECT_TRUE(two->isBetterThan(empty.get()));
    EXPECT_TRUE(three->isBetterThan(two.get()));
    EXPECT_FALSE(two->isBetterThan(three.get()));
    EXPECT_FALSE(two->isBetterThan(content("text/html", "xy")));
    EXPECT_FALSE(empty->isBetterThan(nullptr));
    EXPECT_FALSE(none->isBetterThan(nullptr));
    EXPECT_FALSE(none->isBetterThan(none.get()));
}

TEST_F(ContentCoreTest, ComparesTypeAndData) {
    const Ref<ContentCore> one = content("text/html", "abc");
    EXPECT_TRUE(IsContentEqual(one, one));
    EXPECT_TRUE(IsContentEqual(one, content("text/html", "abc")));
    EXPECT_FALSE(IsContentEqual(one, content("text/plain", "abc")));
    EXPECT_FALSE(IsContentEqual(one, content("text/html", "abd")));
    const ContentCore* none = nullptr;
    EXPECT_TRUE(IsContentEqual(none, none));
    EXPECT_FALSE(IsContentEqual(one, none));
    EXPECT_FALSE(IsContentEqual(none, one));
}

TEST_F(ContentCoreTest, TakesOverTypeAndData) {
    const Ref<ContentCore> copy = content("text/plain", "old");
    copy->copyFrom(content("text/html", "new"));
    EXPECT_EQ(textOf(copy->mMIMEType), "text/html");
    EXPECT_EQ(textOf(copy->getData()), "new");
    copy->copyFrom(content(nullptr, nullptr));
    EXPECT_EQ(textOf(copy->mMIMEType), "(null)");
    EXPECT_EQ(textOf(copy->getData()), "(null)");
}

TEST_F(ContentCoreTest, TakesOverThatItWaitsToBeTidied) {
    const Ref<ContentCore> row = content("text/html", "<p>a");
    row->tidy(url("http://example.org/"));
    const Ref<ContentCore> copy = make<ContentCore>();
    copy->copyFrom(row.get());
    EXPECT_TRUE(copy->needsTidy());
    copy->copyFrom(content("text/html", "<p>a</p>"));
    EXPECT_FALSE(copy->needsTidy());
}

TEST_F(ContentCoreTest, GivesItsDataAsText) {
    EXPECT_EQ(textOf(content("text/html", "<p>\xC3\xA9")->getRawString()), "<p>\xC3\xA9");
    EXPECT_EQ(textOf(content("text/html", nullptr)->getRawString()), "(null)");
    EXPECT_EQ(textOf(content("image/png", "\xFF\xFE\xFD")->getRawString()), "(null)");
}

namespace {

/// A tidier that never can.
class BrokenTidier : public FeedParser::HTMLSnippetTidier {
 public:
    bool setupTidyOptions() override { return false; }
};

/// Both kinds are broken, or one, while it lives.
class BrokenTidiers {
 public:
    BrokenTidiers(bool breaksHTML, bool breaksXML) {
        const Ref<BrokenTidier> broken = Returner<BrokenTidier>::adopted(new BrokenTidier);
        ContentCore::_setTidiers(breaksHTML ? broken.get() : nullptr,
                                 breaksXML ? broken.get() : nullptr);
    }
    ~BrokenTidiers() { ContentCore::_setTidiers(nullptr, nullptr); }
    BrokenTidiers(const BrokenTidiers&) = delete;
    BrokenTidiers& operator=(const BrokenTidiers&) = delete;
};

class ContentTidyTest : public ContentCoreTest {
 protected:
    ContentCore* waiting(const char* type, const char* data) {
        ContentCore* row = content(type, data);
        row->tidy(nullptr);
        return row;
    }
    const Support::LoggingOn on{{&gLogTidier}};
    Support::LogCapture log;
};

}  // namespace

TEST_F(ContentTidyTest, TidiesWhenItIsReadForTheFirstTime) {
    const Ref<ContentCore> row = waiting("text/html", "<p>a");
    EXPECT_FALSE(log.contains("Tidying"));
    EXPECT_EQ(textOf(row->mData), "<p>a");
    EXPECT_EQ(textOf(row->getData()), "<p>a</p>");
    EXPECT_EQ(textOf(row->mData), "<p>a</p>");
    EXPECT_FALSE(row->needsTidy());
    EXPECT_EQ(textOf(row->getData()), "<p>a</p>");
    EXPECT_EQ(log.count("Tidying"), 1);
}

TEST_F(ContentTidyTest, TidiesBeforeItHashesAndCompares) {
    EXPECT_EQ(textOf(waiting("text/html", "<p>a")->getComputedHash()), sha1("<p>a</p>"));
    EXPECT_TRUE(IsContentEqual(waiting("text/html", "<p>a"), content("text/html", "<p>a</p>")));
}

TEST_F(ContentTidyTest, DoesNotTidyToFindTheBetterOne) {
    const Ref<ContentCore> row = waiting("text/html", "<p>a");
    EXPECT_TRUE(row->isBetterThan(waiting("text/html", "<p>")));
    EXPECT_FALSE(IsContentEqual(row, waiting("text/plain", "<p>a")));
    EXPECT_FALSE(log.contains("Tidying"));
}

TEST_F(ContentTidyTest, TidiesByTheTypeAndItsBase) {
    const Ref<ContentCore> row = content("text/html", "<p>a</p>");
    row->tidy(url("http://e.org/base/"));
    row->getData();
    EXPECT_EQ(log.count("[Tidier] Tidying 8 bytes (class=HTMLSnippetTidier, encoding=1, "
                        "baseURL=http://e.org/base/)..."),
              1);
    waiting("application/xhtml+xml", "<p>a</p>")->getData();
    EXPECT_EQ(log.count("class=XMLSnippetTidier, encoding=1, baseURL=(null)"), 1);
    EXPECT_EQ(log.count("Tidying"), 2);
}

TEST_F(ContentTidyTest, TriesTheOtherKindSecond) {
    {
        const BrokenTidiers broken(true, false);
        EXPECT_EQ(textOf(waiting("text/html", "<p>a</p>")->getData()), "<p>a</p>");
        EXPECT_EQ(log.count("Tidying"), 2);
        EXPECT_EQ(log.count("class=XMLSnippetTidier"), 1);
    }
    log.clear();
    const BrokenTidiers broken(false, true);
    EXPECT_EQ(textOf(waiting("application/xhtml+xml", "<p>a</p>")->getData()), "<p>a</p>");
    EXPECT_EQ(log.count("Tidying"), 2);
}

TEST_F(ContentTidyTest, LosesTheDataThatNeitherCanTidy) {
    const BrokenTidiers broken(true, true);
    const Ref<ContentCore> row = waiting("text/html", "<p>a</p>");
    EXPECT_EQ(row->getData(), nullptr);
    EXPECT_EQ(row->mData.getValue(), nullptr);
    EXPECT_FALSE(row->needsTidy());
}

TEST_F(ContentTidyTest, HasNothingToTidyWithoutData) {
    const Ref<ContentCore> row = waiting("text/html", nullptr);
    EXPECT_EQ(row->getData(), nullptr);
    EXPECT_FALSE(log.contains("Tidying"));
}

TEST_F(ContentTidyTest, IsTidyWhenItIsSaved) {
    const Ref<ContentCore> row = waiting("text/html", "<p>a");
    row->saveChanges();
    EXPECT_EQ(count("Contents where cast(data as text)='<p>a</p>'"), 1);
}

TEST_F(ContentTidyTest, ForgetsThatItWaitsWithItsData) {
    const Ref<ContentCore> row = content("text/html", "<p>b</p>");
    row->saveChanges();
    row->mData.setValue(bytes("<p>a"));
    row->tidy(nullptr);
    row->unload();
    EXPECT_FALSE(row->needsTidy());
    EXPECT_EQ(textOf(row->getData()), "<p>b</p>");
}

TEST_F(ContentCoreTest, GivesPlainText) {
    EXPECT_EQ(textOf(content("text/plain", " a <b> &amp; ")->getPlainTextString()),
              " a <b> &amp; ");
    EXPECT_EQ(textOf(content(nullptr, "a")->getPlainTextString()), "a");
    EXPECT_EQ(
        textOf(content("text/html", "<p> a  <b>b</b>\n&amp;&eacute;</p>\n")->getPlainTextString()),
        "a b &\xC3\xA9");
    EXPECT_EQ(textOf(content("application/xhtml+xml", "<p>a</p>")->getPlainTextString()), "a");
    EXPECT_EQ(textOf(content("text/css", "a")->getPlainTextString()), "(null)");
    EXPECT_EQ(textOf(content("image/png", "a")->getPlainTextString()), "(null)");
    EXPECT_EQ(textOf(content("text/html", nullptr)->getPlainTextString()), "(null)");
    EXPECT_EQ(textOf(content("text/html", "")->getPlainTextString()), "");
}

TEST_F(ContentCoreTest, GivesHTML) {
    EXPECT_EQ(textOf(content("text/html", "<p>a</p>")->getHTMLString()), "<p>a</p>");
    EXPECT_EQ(textOf(content("application/xhtml+xml", "<p>a</p>")->getHTMLString()), "<p>a</p>");
    EXPECT_EQ(textOf(content("text/plain", "a & b\nc")->getHTMLString()), "a &amp; b<br>\nc");
    EXPECT_EQ(textOf(content("text/css", "a")->getHTMLString()), "(null)");
    EXPECT_EQ(textOf(content("text/plain", nullptr)->getHTMLString()), "(null)");
}

TEST_F(ContentCoreTest, KeepsItsTextsUntilTheDataChanges) {
    const Ref<ContentCore> row = content("text/html", "<p>a</p>");
    const String* plain = row->getPlainTextString();
    const String* html = row->getHTMLString();
    EXPECT_EQ(row->getPlainTextString(), plain);
    EXPECT_EQ(row->getHTMLString(), html);
    row->copyFrom(content("text/html", "<p>b</p>"));
    EXPECT_EQ(textOf(row->getPlainTextString()), "b");
    EXPECT_EQ(textOf(row->getHTMLString()), "<p>b</p>");
    row->copyFrom(content("text/plain", "<p>b</p>"));
    EXPECT_EQ(textOf(row->getPlainTextString()), "<p>b</p>");
}

TEST_F(ContentCoreTest, ReadsItsTextsAnewFromTheFile) {
    const Ref<ContentCore> row = content("text/html", "<p>a</p>");
    row->saveChanges();
    EXPECT_EQ(textOf(row->getPlainTextString()), "a");
    db().execute("update Contents set data=cast('<p>b</p>' as blob)");
    row->unload();
    EXPECT_EQ(textOf(row->getPlainTextString()), "b");
}

TEST_F(ContentCoreTest, GivesWhatStandsInAtom) {
    EXPECT_EQ(textOf(content("text/html", "<p>a")->getAtomString(false)), "<p>a");
    EXPECT_EQ(textOf(content("text/html", "<p>a")->getAtomString(true)), "&lt;p&gt;a");
    EXPECT_EQ(textOf(content("text/plain", "a&b")->getAtomString(false)), "a&b");
    EXPECT_EQ(textOf(content("text/plain", "a&b")->getAtomString(true)), "a&amp;b");
    EXPECT_EQ(textOf(content("application/xhtml+xml", "<p>a")->getAtomString(true)), "<p>a");
    EXPECT_EQ(textOf(content("image/svg+xml", "<svg/>")->getAtomString(true)), "<svg/>");
    EXPECT_EQ(textOf(content("image/png", "abc")->getAtomString(false)), "YWJj");
    EXPECT_EQ(textOf(content("image/png", "abc")->getAtomString(true)), "YWJj");
    EXPECT_EQ(textOf(content("text/html", nullptr)->getAtomString(false)), "(null)");
}
