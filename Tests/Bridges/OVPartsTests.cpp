#include "Bridges/BridgeTest.h"

#include <Orvane/OVAuthor.h>
#include <Orvane/OVContent.h>

using namespace Foundation;
using namespace Orvane;

namespace {

class OVContentTest : public BridgeTest {};
class OVAuthorTest : public BridgeTest {
 protected:
    /// The author of a row with these values.
    std::shared_ptr<OVAuthor> stored(const char* name) {
        write(OVFormat("insert into Authors (name) values ('%s')", name));
        const Ref<AuthorCore> core =
            AuthorCore::getRow(db().execScalar("select max(rowID) from "
                                               "Authors"));
        return publicObject<OVAuthor>(core.get());
    }
};

}  // namespace

TEST_F(OVContentTest, IsMadeOfATextOrOfHTML) {
    const std::shared_ptr<OVContent> text = OVContent::createFromText("a < b");
    EXPECT_EQ(text->MIMEType(), "text/plain");
    EXPECT_EQ(text->data(), "a < b");
    EXPECT_TRUE(text->isTextual());
    EXPECT_EQ(text->plainTextString(), "a < b");
    EXPECT_EQ(text->HTMLString(), "a &lt; b");
    const std::shared_ptr<OVContent> html = OVContent::createFromHTML("<p>a <b>b</b></p>");
    EXPECT_EQ(html->MIMEType(), "text/html");
    EXPECT_EQ(html->HTMLString(), "<p>a <b>b</b></p>");
    EXPECT_EQ(html->plainTextString(), "a b");
    EXPECT_EQ(html->plainTextString(), "a b");
    EXPECT_EQ(html->description(), "OVContent[text/html, 17 bytes]");
}

TEST_F(OVContentTest, TrimsTheTextOfHTML) {
    EXPECT_EQ(OVContent::createFromHTML(" <p>\n a </p>\n ")->plainTextString(), "a");
    EXPECT_EQ(OVContent::createFromHTML("a&nbsp;&amp; b")->plainTextString(), "a\u00a0& b");
}

TEST_F(OVContentTest, OfOtherDataHasNoText) {
    const std::shared_ptr<OVContent> image = OVContent::create("\x01\x02", "image/png");
    EXPECT_FALSE(image->isTextual());
    EXPECT_FALSE(image->plainTextString());
    EXPECT_FALSE(image->HTMLString());
    EXPECT_EQ(image->data(), "\x01\x02");
}

TEST_F(OVContentTest, WantsDataAndAType) {
    EXPECT_NE(exceptionOf([] { OVContent::create("x", ""); }).find("itsMIMEType"),
              std::string::npos);
    EXPECT_NE(exceptionOf([] { OVContent::create(std::string_view(), "a/b"); }).find("itsData"),
              std::string::npos);
    EXPECT_NE(exceptionOf([] { OVContent::createFromText("\xff"); }), "none");
}

TEST_F(OVContentTest, OfItsOwnIsEqualToItselfAlone) {
    const std::shared_ptr<OVContent> a = OVContent::createFromText("x");
    const std::shared_ptr<OVContent> b = OVContent::createFromText("x");
    EXPECT_TRUE(a->isEqual(a.get()));
    EXPECT_FALSE(a->isEqual(b.get()));
    EXPECT_EQ(a->hash(), a->hash());
}

TEST_F(OVAuthorTest, IsMadeOfWhatIsKnown) {
    const std::shared_ptr<OVAuthor> author = OVAuthor::create("A", "a@e.org", "http://e.org/");
    EXPECT_EQ(author->name(), "A");
    EXPECT_EQ(author->email(), "a@e.org");
    EXPECT_EQ(author->URL(), "http://e.org/");
    EXPECT_EQ(author->description(), "OVAuthor[\"A\" 0]");
    EXPECT_NE(exceptionOf([] { OVAuthor::create({}, {}, {}); }).find("name||email||url"),
              std::string::npos);
    EXPECT_NE(exceptionOf([] { OVAuthor::create({}, {}, "no url"); }), "none");
}

TEST_F(OVAuthorTest, IsShownByTheFirstThatIsNotEmpty) {
    EXPECT_EQ(OVAuthor::create("A", "e", {})->nameForDisplay(), "A");
    EXPECT_EQ(OVAuthor::create("", "e", {})->nameForDisplay(), "e");
    EXPECT_EQ(OVAuthor::create("", "", "http://e.org/")->nameForDisplay(), "http://e.org/");
    EXPECT_FALSE(OVAuthor::create("", {}, {})->nameForDisplay());
}

TEST_F(OVAuthorTest, HasAContactThatTheAgentSets) {
    const std::shared_ptr<OVAuthor> author = stored("A");
    EXPECT_FALSE(author->contactBookUID());
    author->setContactBookUID("uid");
    EXPECT_EQ(agent->calls, Strings{"setContactBookUID(uid)"});
    EXPECT_EQ(author->contactBookUID(), "uid");
    agent->fails = true;
    EXPECT_EQ(exceptionOf([&] { author->setContactBookUID("x"); }),
              "Orvane: -setContactBookUID failed");
}

TEST_F(OVAuthorTest, HasNoPerson) {
    const std::shared_ptr<OVAuthor> author = stored("A");
    author->setContactBookUID("uid");
    EXPECT_EQ(author->person(), nullptr);
    agent->calls.clear();
    author->setPerson(nullptr);
    EXPECT_EQ(agent->calls, Strings{"setContactBookUID((null))"});
    EXPECT_NE(exceptionOf([] { OVAuthor::create(nullptr); }).find("person"), std::string::npos);
}

TEST_F(OVAuthorTest, BecomesTheOneThatTheDatabaseHas) {
    write("insert into Authors (name) values ('A')");
    const std::shared_ptr<OVAuthor> author = OVAuthor::create("A", {}, {});
    author->_addToDatabase();
    EXPECT_EQ(author->_internal().peek()->getRowID(), 1);
    EXPECT_TRUE(agent->calls.empty());
    const std::shared_ptr<OVAuthor> another = OVAuthor::create("B", {}, {});
    EXPECT_EQ(exceptionOf([&] { another->_addToDatabase(); }), "Orvane: -_addToDatabase failed");
    EXPECT_EQ(agent->calls, Strings{"createAuthor(B)"});
    write("insert into Authors (name) values ('C')");
    agent->createdAuthor = AuthorCore::getRow(2);
    another->_addToDatabase();
    EXPECT_EQ(another->_internal().peek()->getRowID(), 2);
}
