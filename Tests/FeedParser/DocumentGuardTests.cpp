#include "FeedParser/DocumentGuard.h"

#include "FeedParser/Text/Bounds.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/StringEncoding.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <string>

using namespace Foundation;
using Orvane::FeedParser::DocumentGuard;
namespace Bounds = Orvane::FeedParser::Bounds;

namespace {

/// What the guard makes of a document: "same", "none", or the document that it gives.
std::string guarded(const std::string& document) {
    const Ref<Data> data = Data::data(document.data(), document.size());
    const Ref<Data> checked = DocumentGuard::check(data.get());
    if (checked.get() == data.get()) return "same";
    return checked.get() ? std::string(checked->view()) : "none";
}

std::string repeated(const std::string& text, std::size_t times) {
    std::string all;
    for (std::size_t i = 0; i < times; ++i) {
        all += text;
    }
    return all;
}

std::string withSubset(const std::string& declarations, const std::string& root = "<a/>") {
    return "<?xml version=\"1.0\"?><!-- [ --><!DOCTYPE a SYSTEM \"[x\" [" + declarations + "]>" +
           root;
}

class DocumentGuardTest : public testing::Test {
 protected:
    AutoreleasePool pool;
    Support::LogCapture log;
    Support::LoggingOn on{{&Orvane::gLogParser}};
    ~DocumentGuardTest() noexcept override {}
};

TEST_F(DocumentGuardTest, LeavesOrdinaryDocumentsAlone) {
    for (const std::string& document :
         {std::string(), std::string("text"), std::string("<a b='c'>d</a>"),
          withSubset("<!ENTITY b \"]>\"><!ATTLIST a c CDATA 'd'>"),
          "<a>" + repeated("= \" ' ", 10000) + "</a>",
          "<a>&lt;b " + repeated("c=\"\" ", Bounds::kAttributes + 1) + "></a>",
          "<a><![CDATA[" + repeated("<b>", Bounds::kTags + 1) + "]]></a>"}) {
        EXPECT_EQ(guarded(document), "same") << document.substr(0, 100);
    }
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(DocumentGuardTest, AcceptsNoData) {
    EXPECT_EQ(Ref<Data>(DocumentGuard::check(nullptr)).get(), nullptr);
}

TEST_F(DocumentGuardTest, CutsDeclarationsThatAreTooLongOrHaveTooManyParameterEntities) {
    for (const std::string& declarations :
         {repeated("<!ENTITY a \"]>\">", Bounds::kSubsetBytes / 16 + 1),
          "<!ENTITY % a 'b'>" + repeated("%a;", Bounds::kSubsetPercents)}) {
        const std::string found = guarded(withSubset(declarations));
        EXPECT_EQ(found.substr(0, 51), "<?xml version=\"1.0\"?><!-- [ --><!DOCTYPE a SYSTEM \"");
        EXPECT_EQ(found.find("ENTITY"), std::string::npos);
        EXPECT_TRUE(found.ends_with(" ><a/>"));
    }
    EXPECT_EQ(log.count("A document has reached the bound"), 2);
}

TEST_F(DocumentGuardTest, CutsDefaultAttributesOfManyElements) {
    const std::string declaration = "<!ATTLIST a b CDATA \"" + std::string(1000, 'x') + "\">";
    EXPECT_EQ(guarded(withSubset(declaration, repeated("<a/>", 100))), "same");
    const std::size_t many = Bounds::kDefaultAttributeBytes / 1000 + 1;
    const std::string found = guarded(withSubset(declaration, repeated("<a/>", many)));
    EXPECT_EQ(found.find("ATTLIST"), std::string::npos);
    EXPECT_TRUE(log.contains("default attributes"));
}

TEST_F(DocumentGuardTest, GivesUpOnDeclarationsThatHaveNoEnd) {
    EXPECT_EQ(guarded(withSubset("<!ENTITY a \"" + std::string(Bounds::kSubsetBytes, 'x'))),
              "none");
}

TEST_F(DocumentGuardTest, CutsAttributesBeyondTheMostThatATagMayHave) {
    std::string tag = "<a";
    for (std::size_t i = 0; i < Bounds::kAttributes + 2; ++i) {
        tag += " a" + std::to_string(i) + "='>'";
    }
    const std::string found = guarded("<x>" + tag + ">text</a></x>");
    const std::string last = "a" + std::to_string(Bounds::kAttributes - 1) + "='>'";
    const std::size_t end = found.find(last);
    ASSERT_NE(end, std::string::npos);
    EXPECT_EQ(found.find_first_not_of(' ', end + last.size()), found.find(">text</a></x>"));
    EXPECT_TRUE(log.contains("\"attributes\", 1000"));
}

TEST_F(DocumentGuardTest, GivesUpOnTooManyTags) {
    EXPECT_EQ(guarded(repeated("<a/>", Bounds::kTags)), "same");
    EXPECT_EQ(guarded(repeated("<a/>", Bounds::kTags + 1)), "none");
    EXPECT_TRUE(log.contains("\"tags\""));
}

TEST_F(DocumentGuardTest, LooksThroughEncodingsThatHideWhatItLooksFor) {
    const std::string bomb =
        "<!DOCTYPE a [<!ENTITY % b 'c'>" + repeated("%b;", Bounds::kSubsetPercents) + "]><a/>";
    for (const char* name : {"UTF-16LE", "UTF-16BE", "UTF-32BE"}) {
        const auto encoding = StringEncoding::named(name);
        const std::string found = guarded(encoding->encode("\xEF\xBB\xBF" + bomb).value());
        EXPECT_EQ(found.substr(0, 11), "<!DOCTYPE a") << name;
        EXPECT_TRUE(found.ends_with(" ><a/>")) << name;
    }
    const std::string hidden = StringEncoding::named("UTF-7")->encode(bomb).value();
    EXPECT_TRUE(guarded("<?xml version=\"1.0\" encoding=\"UTF-7\"?>" + hidden).ends_with(" ><a/>"));
    EXPECT_EQ(guarded(StringEncoding::kUTF16LE.encode("<a b='c'/>").value()), "same");
}

}  // namespace
