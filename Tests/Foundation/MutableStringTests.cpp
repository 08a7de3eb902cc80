#include "Foundation/MutableString.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/Ref.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

using namespace Foundation;

TEST(MutableString, Grows) {
    const Ref<String> b = String::string("b");
    const Ref<MutableString> text = MutableString::mutableString("a");
    text->append(b);
    text->append(static_cast<String*>(nullptr));
    text->append("c");
    EXPECT_EQ(text->view(), "abc");
    text->append(text);
    EXPECT_EQ(text->view(), "abcabc");
    text->removeAll();
    EXPECT_TRUE(text->isEmpty());
}

TEST(MutableString, AppendsFormats) {
    const Ref<String> format = String::string("[%d]");
    const Ref<MutableString> text = MutableString::mutableString();
    text->appendFormat("%@-%02x", format, 10);
    text->appendFormat(format, 5);
    text->appendFormat(static_cast<String*>(nullptr), 5);
    const OVFormatArgument arguments[] = {6};
    text->appendFormatAndArgs(format, arguments);
    EXPECT_EQ(text->view(), "[%d]-0a[5][6]");
}

TEST(MutableString, IsMadeLikeAString) {
    const Support::LogCapture log;
    EXPECT_EQ(Ref<MutableString>(String::mutableString("x"))->view(), "x");
    EXPECT_EQ(Ref<MutableString>(String::mutableString(nullptr)).get(), nullptr);
    EXPECT_TRUE(log.lines().empty());
    EXPECT_EQ(Ref<MutableString>(String::mutableString("\xFF")).get(), nullptr);
    EXPECT_TRUE(log.contains("unable to parse UTF-8 C string"));
}

TEST(MutableString, IsACopyOfItsOwn) {
    const Ref<String> original = String::string("a");
    const Ref<MutableString> copy = original->mutableCopy();
    copy->append("b");
    EXPECT_EQ(original->view(), "a");
    const Ref<MutableString> further = copy->mutableCopy();
    copy->append("c");
    EXPECT_EQ(further->view(), "ab");
}

TEST(MutableString, HandsOutTextsThatStayAsTheyAre) {
    const AutoreleasePool pool;
    const Ref<MutableString> text = MutableString::mutableString("a");
    const String* before = ToString(text.get());
    const char* bytes = text->toCString();
    text->append(std::string(100, 'x'));
    EXPECT_EQ(before->view(), "a");
    EXPECT_STREQ(bytes, "a");
}
