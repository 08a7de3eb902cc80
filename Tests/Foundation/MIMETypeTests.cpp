#include "Foundation/MIMEType.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/FormatObjects.h"

#include <gtest/gtest.h>

using namespace Foundation;

namespace {

Ref<MIMEType> type(const char* text) {
    const Ref<String> string = String::string(text);
    return MIMEType::type(string);
}

bool isBaseEqual(const char* a, const char* b) {
    return type(a)->isBaseEqual(type(b).get());
}

}  // namespace

TEST(MIMEType, OfNullIsNull) {
    EXPECT_EQ(Ref<MIMEType>(MIMEType::type(nullptr)).get(), nullptr);
}

TEST(MIMEType, KeepsItsText) {
    const AutoreleasePool pool;
    const Ref<MIMEType> html = type(" Text/HTML ; charset=UTF-8");
    EXPECT_EQ(html->getString()->view(), " Text/HTML ; charset=UTF-8");
    EXPECT_EQ(OVFormat("%@", html), " Text/HTML ; charset=UTF-8");
}

TEST(MIMEType, HasABaseWithoutParameters) {
    EXPECT_EQ(type(" Text/HTML ; charset=UTF-8; x=y")->getBase()->view(), "text/html");
    EXPECT_EQ(type("AUDIO/MPEG")->getBase()->view(), "audio/mpeg");
    EXPECT_EQ(type(";x")->getBase()->view(), "");
    EXPECT_EQ(type(" \t\r\n")->getBase()->view(), "");
}

TEST(MIMEType, SplitsAtTheFirstSlash) {
    EXPECT_EQ(type("Audio/MPEG/x; a=b")->getType()->view(), "audio");
    EXPECT_EQ(type("Audio/MPEG/x; a=b")->getSubType()->view(), "mpeg/x");
    EXPECT_EQ(type("audio/")->getSubType()->view(), "");
    EXPECT_EQ(type("audio")->getType()->view(), "audio");
    EXPECT_EQ(type("audio")->getSubType(), nullptr);
}

TEST(MIMEType, IsComparedByItsBase) {
    EXPECT_TRUE(isBaseEqual("audio/mpeg; q=1", "AUDIO/MPEG"));
    EXPECT_FALSE(isBaseEqual("audio/mpeg", "audio/ogg"));
    EXPECT_FALSE(isBaseEqual("audio/mpeg", "video/mpeg"));
    EXPECT_FALSE(isBaseEqual("audio/mpeg", "audio"));
    EXPECT_TRUE(isBaseEqual("audio", "audio"));
    EXPECT_FALSE(type("audio")->isBaseEqual(nullptr));
}

TEST(MIMEType, MatchesAWildCardAsTheArgumentOnly) {
    EXPECT_TRUE(isBaseEqual("audio/mpeg; q=1", "AUDIO/*"));
    EXPECT_TRUE(isBaseEqual("audio", "audio/*"));
    EXPECT_FALSE(isBaseEqual("video/mpeg", "audio/*"));
    EXPECT_FALSE(isBaseEqual("audio/*", "audio/mpeg"));
    EXPECT_FALSE(isBaseEqual("audio/mpeg", "*/*"));
}

TEST(MIMEType, TellsTextAndXML) {
    EXPECT_TRUE(type("TEXT/css; x")->isTextType());
    EXPECT_FALSE(type("text")->isTextType());
    EXPECT_FALSE(type("application/text/")->isTextType());
    EXPECT_TRUE(type("application/atom+xml; charset=utf-8")->isXMLType());
    EXPECT_TRUE(type("text/XML")->isXMLType());
    EXPECT_FALSE(type("text/xml-dtd")->isXMLType());
    EXPECT_FALSE(type("xml")->isXMLType());
}

TEST(MIMEType, SharesItsFixedValues) {
    EXPECT_EQ(MIMEType::textPlain()->getString()->view(), "text/plain");
    EXPECT_EQ(MIMEType::textHTML()->getString()->view(), "text/html");
    EXPECT_EQ(MIMEType::applicationXHTML()->getString()->view(), "application/xhtml+xml");
    EXPECT_EQ(MIMEType::applicationOctetStream()->getString()->view(), "application/octet-stream");
    EXPECT_EQ(MIMEType::textPlain(), MIMEType::textPlain());
    EXPECT_EQ(MIMEType::textHTML(), MIMEType::textHTML());
    EXPECT_EQ(MIMEType::applicationXHTML(), MIMEType::applicationXHTML());
    EXPECT_EQ(MIMEType::applicationOctetStream(), MIMEType::applicationOctetStream());
}

TEST(MIMEType, EqualsByItsText) {
    EXPECT_TRUE(type("text/html")->isEqual(MIMEType::textHTML()));
    EXPECT_EQ(type("text/html")->getPFHashCode(), MIMEType::textHTML()->getPFHashCode());
    EXPECT_FALSE(type("Text/html")->isEqual(MIMEType::textHTML()));
    EXPECT_FALSE(type("text/html")->isEqual(nullptr));
}
