#include "Foundation/String.h"

#include "Foundation/ArrayOf.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/MutableString.h"
#include "Foundation/Number.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <climits>

using namespace Foundation;

namespace {

#define EURO "\xE2\x82\xAC"
#define GRIN "\xF0\x9F\x98\x80"

Ref<String> make(const char* utf8) {
    return String::string(utf8);
}

/// A text for comparison, "(null)" for null.
std::string plain(StringReturner returner) {
    const Ref<String> string = std::move(returner);
    return string ? string->utf8() : "(null)";
}
std::string plain(DataReturner returner) {
    const Ref<Data> data = std::move(returner);
    return data ? std::string(data->view()) : "(null)";
}

}  // namespace

TEST(String, IsMadeFromUTF8) {
    EXPECT_EQ(plain(String::string("a" EURO GRIN)), "a" EURO GRIN);
    EXPECT_EQ(plain(String::string("")), "");
    EXPECT_EQ(plain(String::string(static_cast<const char*>(nullptr))), "(null)");
}

TEST(String, WarnsOfWhatIsNotUTF8) {
    const Support::LogCapture log;
    EXPECT_EQ(plain(String::string("bad\xFF")), "(null)");
    EXPECT_EQ(log.lines(),
              std::vector<std::string>{
                  "[WARNING] String::string - unable to parse UTF-8 C string:\n\nbad\xFF\n"});
}

TEST(String, IsMadeFromBytesOfAnEncoding) {
    const Support::LogCapture log;
    const Bytes latin1(std::string_view("caf\xE9"));
    EXPECT_EQ(plain(String::string(latin1, StringEncoding::kLatin1)), "caf\xC3\xA9");
    EXPECT_EQ(plain(String::string(latin1, StringEncoding::kUTF8)), "(null)");
    EXPECT_EQ(plain(String::string(Bytes(), StringEncoding::kUTF8)), "");
    EXPECT_EQ(plain(String::string("\x80xx", 1, StringEncoding::kWindows1252)), EURO);
    EXPECT_EQ(plain(String::string(nullptr, 1, StringEncoding::kUTF8)), "(null)");
    EXPECT_EQ(plain(String::string("x", -1, StringEncoding::kUTF8)), "(null)");
    EXPECT_EQ(plain(String::externalString("\xA5", StringEncoding::kMacRoman)), "\xE2\x80\xA2");
    EXPECT_EQ(plain(String::externalString(nullptr, StringEncoding::kMacRoman)), "(null)");
    EXPECT_TRUE(log.lines().empty());
}

TEST(String, IsMadeFromBase64) {
    EXPECT_EQ(plain(String::stringFromBase64(make("4oKs").get())), EURO);
    EXPECT_EQ(plain(String::stringFromBase64(make("/w==").get())), "(null)");
    EXPECT_EQ(plain(String::stringFromBase64(nullptr)), "(null)");
}

TEST(String, WritesBytesInHexadecimal) {
    EXPECT_EQ(plain(String::hexString(Bytes(std::string_view("\x00\x0A\xFF", 3)))), "000aff");
    EXPECT_EQ(plain(String::hexString(Bytes())), "");
}

TEST(String, JoinsElements) {
    const Ref<String> a = make("a"), b = make("b"), comma = make(", ");
    const Ref<ArrayOf<String>> elements = ArrayOf<String>::array({a, nullptr, b});
    EXPECT_EQ(plain(String::stringByJoining(elements, comma)), "a, , b");
    EXPECT_EQ(plain(String::stringByJoining(elements, nullptr)), "ab");
    EXPECT_EQ(
        plain(String::stringByJoining(Ref<ArrayOf<String>>(ArrayOf<String>::array()).get(), comma)),
        "");
    EXPECT_EQ(plain(String::stringByJoining(nullptr, comma)), "(null)");
}

TEST(String, FormatsLiteralsAndFormatsKnownAtRunTime) {
    const Ref<String> object = make("x"), format = make("%@ of %d");
    EXPECT_EQ(plain(String::stringWithFormat("%@ %s %d", object, "s", 3)), "x s 3");
    EXPECT_EQ(plain(String::stringWithFormat(format, object, 3)), "x of 3");
    EXPECT_EQ(plain(String::stringWithFormat(format, 3)), "%@ of 3");
    EXPECT_EQ(plain(String::stringWithFormat(make("plain").get())), "plain");
    EXPECT_EQ(plain(String::stringWithFormat(static_cast<String*>(nullptr), 3)), "(null)");
    const OVFormatArgument arguments[] = {7};
    EXPECT_EQ(plain(String::stringWithFormatAndArgs(make("<%d>").get(), arguments)), "<7>");
    EXPECT_EQ(plain(String::stringWithFormatAndArgs(nullptr, arguments)), "(null)");
}

TEST(String, CountsCharacters) {
    EXPECT_EQ(make("a" EURO GRIN)->getLength(), 3u);
    EXPECT_EQ(make("")->getLength(), 0u);
    EXPECT_TRUE(make("")->isEmpty());
    EXPECT_TRUE(String::isEmpty(nullptr));
    EXPECT_FALSE(String::isEmpty(make("a").get()));
}

TEST(String, GivesSubstringsByCharacters) {
    const Ref<String> text = make("a" EURO GRIN "z");
    EXPECT_EQ(plain(text->getSubstring(0)), text->utf8());
    EXPECT_EQ(plain(text->getSubstring(2)), GRIN "z");
    EXPECT_EQ(plain(text->getSubstring(4)), "");
    EXPECT_EQ(plain(text->getSubstring(5)), "");
    EXPECT_EQ(plain(text->getSubstring(1, 2)), EURO GRIN);
    EXPECT_EQ(plain(text->getSubstring(1, 0)), "");
    EXPECT_EQ(plain(text->getSubstring(3, SIZE_MAX)), "z");
    EXPECT_EQ(plain(text->getSubstring(SIZE_MAX, SIZE_MAX)), "");
}

TEST(String, AppendsAText) {
    const Ref<String> a = make("a");
    EXPECT_EQ(plain(a->getStringByAppendingString(make("b").get())), "ab");
    EXPECT_EQ(plain(a->getStringByAppendingString(nullptr)), "a");
    EXPECT_EQ(a->view(), "a");
}

TEST(String, MapsCase) {
    EXPECT_EQ(plain(make("stra\xC3\x9F"
                         "e \xC3\xA9i")
                        ->getUpperCaseString()),
              "STRASSE \xC3\x89I");
    EXPECT_EQ(plain(make("\xC3\x89I \xCE\x9F\xCE\x94\xCE\x9F\xCE\xA3")->getLowerCaseString()),
              "\xC3\xA9i \xCE\xBF\xCE\xB4\xCE\xBF\xCF\x82");
    EXPECT_EQ(plain(make("")->getUpperCaseString()), "");
}

TEST(String, TrimsWhiteSpace) {
    EXPECT_EQ(
        plain(make(" \t\r\n\xC2\xA0\xE3\x80\x80 a " EURO "\xE2\x80\xA8\n")->getTrimmedString()),
        "a " EURO);
    EXPECT_EQ(plain(make(" \n ")->getTrimmedString()), "");
    EXPECT_EQ(plain(make("")->getTrimmedString()), "");
    EXPECT_EQ(plain(make("ab")->getTrimmedString()), "ab");
}

TEST(String, TellsWhatItContains) {
    const Ref<String> text = make("feed:example");
    const Ref<String> feed = make("feed:"), other = make("Feed:"), empty = make("");
    EXPECT_TRUE(text->hasPrefix(feed));
    EXPECT_FALSE(text->hasPrefix(other));
    EXPECT_FALSE(text->hasPrefix(static_cast<String*>(nullptr)));
    EXPECT_TRUE(text->hasPrefix(empty));
    EXPECT_TRUE(text->hasSuffix("example"));
    EXPECT_FALSE(text->hasSuffix(feed));
    EXPECT_FALSE(text->hasSuffix(static_cast<String*>(nullptr)));
    EXPECT_TRUE(text->contains("d:e"));
    EXPECT_FALSE(text->contains(other));
    EXPECT_FALSE(text->contains(static_cast<String*>(nullptr)));
}

TEST(String, ReadsNumbers) {
    EXPECT_EQ(make("42")->toLongLong(), 42);
    EXPECT_EQ(make("  -7 rows")->toLongLong(), -7);
    EXPECT_EQ(make("+9223372036854775807")->toLongLong(), LLONG_MAX);
    EXPECT_EQ(make("99999999999999999999")->toLongLong(), LLONG_MAX);
    EXPECT_EQ(make("-99999999999999999999")->toLongLong(), LLONG_MIN);
    EXPECT_EQ(make("0x10")->toLongLong(), 0);
    EXPECT_EQ(make("none")->toLongLong(), 0);
    EXPECT_EQ(make("")->toLongLong(), 0);
    EXPECT_EQ(String::toLongLong(nullptr), 0);
    EXPECT_EQ(String::toLongLong(make("5").get()), 5);
}

TEST(String, ReadsNoNumberFromMoreThan31Bytes) {
    EXPECT_EQ(make("0000000000000000000000000000042")->toLongLong(), 42);
    EXPECT_EQ(make("00000000000000000000000000000042")->toLongLong(), 0);
}

TEST(String, GivesACStringForTheLifeOfThePool) {
    const AutoreleasePool pool;
    const char* text = nullptr;
    {
        const Ref<String> string = make("gone by now");
        text = string->toCString();
    }
    EXPECT_STREQ(text, "gone by now");
}

TEST(String, GivesItsBytes) {
    const Ref<String> text = make("caf\xC3\xA9");
    EXPECT_EQ(plain(text->getData()), "caf\xC3\xA9");
    EXPECT_EQ(plain(text->toCStringData()), std::string("caf\xC3\xA9\0", 6));
    EXPECT_EQ(plain(text->getData(StringEncoding::kLatin1)), "caf\xE9");
    EXPECT_EQ(plain(text->getData(StringEncoding::kASCII)), "(null)");
    EXPECT_EQ(plain(make("")->toCStringData()), std::string("\0", 1));
    const std::string longText(1000, 'x');
    EXPECT_EQ(plain(make(longText.c_str())->toCStringData()), longText + '\0');
}

TEST(String, EqualsByCodePoints) {
    const Ref<String> text = make("a"), same = make("a"), other = make("b");
    const Ref<MutableString> changeable = String::mutableString("a");
    EXPECT_TRUE(text->isEqual(same));
    EXPECT_EQ(text->getHash(), same->getHash());
    EXPECT_EQ(text->getHash(), String::hashOf("a"));
    EXPECT_TRUE(text->isEqual(changeable));
    EXPECT_TRUE(changeable->isEqual(text));
    EXPECT_EQ(text->getHash(), changeable->getHash());
    EXPECT_FALSE(text->isEqual(other));
    EXPECT_FALSE(text->isEqual(nullptr));
    EXPECT_FALSE(text->isEqual(Ref<Number>(Number::number(1)).get()));
    EXPECT_FALSE(make("\xC3\xA9")->isEqual(make("e\xCC\x81").get()));
}

TEST(String, ViewsNullAsEmpty) {
    EXPECT_EQ(String::view(nullptr), "");
    EXPECT_EQ(String::view(make("a").get()), "a");
}

TEST(ToString, GivesTheTextOfAnything) {
    const AutoreleasePool pool;
    const Ref<Number> number = Number::number(5);
    EXPECT_EQ(ToString(number.get())->view(), "5");
    EXPECT_EQ(ToString(static_cast<PFRefCounted*>(nullptr)), nullptr);
    EXPECT_EQ(ToString(static_cast<RefCounted*>(nullptr)), nullptr);
    EXPECT_EQ(ToString(LLONG_MIN)->view(), "-9223372036854775808");
    EXPECT_EQ(ToString(ULLONG_MAX)->view(), "18446744073709551615");
    EXPECT_EQ(ToString(0)->view(), "0");
    EXPECT_EQ(ToString(7u)->view(), "7");
}

TEST(ToString, NamesBadPointers) {
    const AutoreleasePool pool;
    const auto* value = reinterpret_cast<const PFRefCounted*>(0x1001);
    const auto* object = reinterpret_cast<const RefCounted*>(0x10);
    EXPECT_EQ(ToString(value)->view(), "BAD_OBJECT(0x1001)");
    EXPECT_EQ(ToString(object)->view(), "BAD_OBJECT(0x10)");
    EXPECT_EQ(plain(ToStringUnpooled(value)), "BAD_OBJECT(0x1001)");
}

TEST(ToString, NeedsNoPoolWhenTold) {
    const Support::LogCapture log;
    const Ref<Number> number = Number::number(5);
    EXPECT_EQ(plain(ToStringUnpooled(number.get())), "5");
    EXPECT_EQ(plain(ToStringUnpooled(static_cast<RefCounted*>(nullptr))), "(null)");
    EXPECT_TRUE(log.lines().empty());
}
