#include "Model/ContentCore.h"

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
