#include "FeedParser/Text/ParserUtils.h"

#include "Foundation/AutoreleasePool.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

using namespace Foundation;
using Orvane::ParserUtils;

namespace {

/// What a routine makes of a text, elsewhere and in place, which must be the same.
template <class Routine>
std::string resultOf(const std::string& text, Routine routine) {
    std::vector<char> elsewhere(text.size() + 1, 'x');
    const std::size_t length = routine(text.c_str(), elsewhere.data());
    EXPECT_EQ(std::strlen(elsewhere.data()), length);
    std::string inPlace = text;
    EXPECT_EQ(routine(inPlace.c_str(), inPlace.data()), length);
    EXPECT_STREQ(inPlace.c_str(), elsewhere.data());
    return elsewhere.data();
}

std::string decoded(const std::string& text, bool trim = false) {
    return resultOf(text, [trim](const char* src, char* dst) {
        return ParserUtils::decodeEntities(src, dst, trim);
    });
}

std::string plain(const std::string& text) {
    return resultOf(text, &ParserUtils::convertToPlainText);
}

std::string html(const char* text) {
    const Ref<String> result = ParserUtils::convertToHTML(text);
    return result ? result->utf8() : "(null)";
}

/// The bytes behind a base64 text, or "(none)".
std::string base64(const char* text) {
    char* out = const_cast<char*>("not set");
    std::size_t length = 99;
    ParserUtils::decodeBase64(text, &out, &length);
    if (!out) return length == 0 ? "(none)" : "(none, but a length)";
    EXPECT_EQ(out[length], '\0');
    std::string bytes(out, length);
    std::free(out);
    return bytes;
}

std::string trimmed(std::string text) {
    char* start = text.data();
    const char* end = start + text.size();
    ParserUtils::trim(&start);
    for (const char* c = start + std::strlen(start); c < end; ++c) {
        EXPECT_EQ(*c, '\0');
    }
    return start;
}

struct Case {
    const char* text;
    const char* expected;
};

class DecodedReferences : public testing::TestWithParam<Case> {};
class WindowsReferences : public testing::TestWithParam<std::pair<int, const char*>> {};
class PlainTexts : public testing::TestWithParam<Case> {};
class HTMLTexts : public testing::TestWithParam<Case> {};

}  // namespace

TEST_P(DecodedReferences, GiveTheirCharacters) {
    EXPECT_EQ(decoded(GetParam().text), GetParam().expected);
}

INSTANTIATE_TEST_SUITE_P(
    ParserUtils, DecodedReferences,
    testing::Values(
        Case{"", ""}, Case{"plain", "plain"}, Case{"caf\xC3\xA9", "caf\xC3\xA9"},
        // By name.
        Case{"&eacute;", "é"}, Case{"&Eacute;", "É"}, Case{"&EACUTE;", "É"}, Case{"&tau;", "Τ"},
        Case{"&Tau;", "Τ"}, Case{"&apos;", "'"}, Case{"&AMP;", "&"}, Case{"&Amp;", "&"},
        Case{"&LT;", "<"}, Case{"&NBSP;", "\xC2\xA0"}, Case{"&EURO;", "€"}, Case{"&alpha;", "α"},
        Case{"&ALPHA;", "Α"}, Case{"&yuml;", "ÿ"}, Case{"&YUML;", "Ÿ"}, Case{"&thetasym;", "ϑ"},
        Case{"&frac12;&there4;", "½∴"}, Case{"&ne;", "≠"}, Case{"a&lt;b&gt;c", "a<b>c"},
        // By number.
        Case{"&#65;&#x41;&#X41;", "AAA"}, Case{"&#9;", "\t"}, Case{"&#0065;", "A"},
        Case{"&#00065;", "A"}, Case{"&#x0041;", "A"}, Case{"&#xe9;&#xE9;", "éé"},
        Case{"&#8364;", "€"}, Case{"&#12345;", "\xE3\x80\xB9"}, Case{"&#xFFFD;", "\xEF\xBF\xBD"},
        // Cut to 16 bits: 65601 is 65536 and 65.
        Case{"&#65601;", "A"},
        // As Windows-1252, but only in the short forms.
        Case{"&#150;&#x96;&#X96;", "–––"}, Case{"&#128;", "\xC2\x80"}, Case{"&#x80;", "\xC2\x80"},
        Case{"&#142;&#158;", "\xC2\x8E\xC2\x9E"}, Case{"&#141;", "\xC2\x8D"},
        Case{"&#157;", "\xC2\x9D"}, Case{"&#160;", "\xC2\xA0"}, Case{"&#0150;", "\xC2\x96"},
        Case{"&#x096;", "\xC2\x96"}, Case{"&#129;", "\xC2\x81"},
        // Not complete, or no reference.
        Case{"&foo;", "&foo;"}, Case{"&amp", "&amp"}, Case{"&#65", "&#65"}, Case{"&", "&"},
        Case{"a & b", "a & b"}, Case{"&;", "&;"}, Case{"&#;", "&#;"}, Case{"&#x;", "&#x;"},
        Case{"&#xg;", "&#xg;"}, Case{"&#1a;", "&#1a;"}, Case{"&#-1;", "&#-1;"},
        Case{"&# 65;", "&# 65;"}, Case{"&#123456;", "&#123456;"}, Case{"&#x12345;", "&#x12345;"},
        Case{"&thetasymb;", "&thetasymb;"}, Case{"& amp;", "& amp;"}, Case{"&#", "&#"},
        Case{"&#x", "&#x"},
        // What follows an "&" that stays may be a reference itself.
        Case{"&&amp;", "&&"}, Case{"&#&lt;", "&#<"}, Case{"&amp&lt;", "&amp<"},
        // Not decoded twice.
        Case{"&amp;amp;", "&amp;"}, Case{"&amp;lt;b&amp;gt;", "&lt;b&gt;"},
        Case{"&#38;#65;", "&#65;"},
        // No character of their own.
        Case{"a&#xD83D;&#xDE00;b", "ab"}, Case{"a&#0;b", "ab"}, Case{"a&#65536;b", "ab"}));

TEST_P(WindowsReferences, GiveTheCharacterOfWindows1252) {
    const auto [code, character] = GetParam();
    const std::string decimal = std::to_string(code);
    char hex[8];
    std::snprintf(hex, sizeof hex, "%x", static_cast<unsigned>(code));
    EXPECT_EQ(decoded("&#" + decimal + ";"), character);
    EXPECT_EQ(decoded("&#x" + std::string(hex) + ";"), character);
    EXPECT_NE(decoded("&#0" + decimal + ";"), character);
}

INSTANTIATE_TEST_SUITE_P(
    ParserUtils, WindowsReferences,
    testing::Values(std::pair(130, "\u201A"), std::pair(131, "\u0192"), std::pair(132, "\u201E"),
                    std::pair(133, "\u2026"), std::pair(134, "\u2020"), std::pair(135, "\u2021"),
                    std::pair(136, "\u02C6"), std::pair(137, "\u2030"), std::pair(138, "\u0160"),
                    std::pair(139, "\u2039"), std::pair(140, "\u0152"), std::pair(145, "\u2018"),
                    std::pair(146, "\u2019"), std::pair(147, "\u201C"), std::pair(148, "\u201D"),
                    std::pair(149, "\u2022"), std::pair(150, "\u2013"), std::pair(151, "\u2014"),
                    std::pair(152, "\u02DC"), std::pair(153, "\u2122"), std::pair(154, "\u0161"),
                    std::pair(155, "\u203A"), std::pair(156, "\u0153"), std::pair(159, "\u0178")));

TEST(ParserUtils, TrimsWhatItDecodesOnlyIfAsked) {
    EXPECT_EQ(decoded(" a ", true), "a");
    EXPECT_EQ(decoded(" a ", false), " a ");
    EXPECT_EQ(decoded("\t\r\n a \t b\r\n\t ", true), "a \t b");
    EXPECT_EQ(decoded(" \n ", true), "");
    EXPECT_EQ(decoded(" &amp; ", true), "&");
    EXPECT_EQ(decoded(" & ", true), "&");
    EXPECT_EQ(decoded("\v a", true), "\v a");
}

TEST(ParserUtils, KeepsDecodedBlanksAtTheStartButNotAtTheEnd) {
    EXPECT_EQ(decoded(" &#32; a", true), "  a");
    EXPECT_EQ(decoded("a &#32;", true), "a");
    EXPECT_EQ(decoded("&#32;", true), "");
    EXPECT_EQ(decoded(" &#xD800; a", true), "a") << "nothing had been written yet";
}

TEST_P(PlainTexts, LoseTagsAndRunsOfBlanks) {
    EXPECT_EQ(plain(GetParam().text), GetParam().expected);
}

INSTANTIATE_TEST_SUITE_P(
    ParserUtils, PlainTexts,
    testing::Values(Case{"", ""}, Case{"a", "a"}, Case{"a <b>bold</b> move", "a bold move"},
                    Case{" \t\r\n a \n\n b ", " a b "}, Case{"a\vb\fc\x01", "a\vb\fc\x01"},
                    Case{"1 < 2", "1 < 2"}, Case{"1 < 2 and 3 > 2", "1  2"}, Case{"<>", "<>"},
                    Case{"a<>b", "a<>b"}, Case{"<", "<"}, Case{"a<", "a<"}, Case{"a<b", "a<b"},
                    Case{"<<b>", ""}, Case{"<b><", "<"}, Case{"a<br>b<br/>c", "abc"},
                    Case{"a <i> </i> b", "a   b"}, Case{"<a\nhref='>'>x", "'>x"},
                    Case{"&lt;b&gt; &amp;", "&lt;b&gt; &amp;"}, Case{"<< <\n<", "<< < <"},
                    Case{"a > b", "a > b"}, Case{"<><b>", "<>"}));

TEST(ParserUtils, MakesPlainTextOfOpenTagsInOnePass) {
    // Each "<" looks for a ">", but no further than once to the text's end.
    const std::string open(4u << 20, '<');
    EXPECT_EQ(plain(open), open);
}

TEST_P(HTMLTexts, AreSafe) {
    EXPECT_EQ(html(GetParam().text), GetParam().expected);
}

INSTANTIATE_TEST_SUITE_P(
    ParserUtils, HTMLTexts,
    testing::Values(Case{"", ""}, Case{"a  b\r\n\r\n  c", "a b<br>\nc"}, Case{"a \t b", "a b"},
                    Case{"a\rb", "a<br>\nb"}, Case{"a\r \tb", "a<br>\nb"},
                    Case{"a\n\n\nb", "a<br>\nb"}, Case{"a \n b", "a <br>\nb"},
                    Case{"a\n \nb", "a<br>\n<br>\nb"}, Case{" a ", " a "}, Case{"\n", "<br>\n"},
                    Case{"\"&'<>", "&quot;&amp;&apos;&lt;&gt;"}, Case{"&amp;", "&amp;amp;"},
                    Case{"caf\xC3\xA9\v", "caf\xC3\xA9\v"}));

TEST(ParserUtils, MakesNoHTMLOfNull) {
    EXPECT_EQ(html(nullptr), "(null)");
    EXPECT_EQ(Ref<String>(ParserUtils::convertToHTML(static_cast<const Data*>(nullptr))).get(),
              nullptr);
}

TEST(ParserUtils, MakesHTMLOfDataWithoutATerminator) {
    const Ref<Data> data = Data::data("a<b--", 3);
    EXPECT_EQ(Ref<String>(ParserUtils::convertToHTML(data))->utf8(), "a&lt;b");
    const Ref<Data> none = Data::adopt("");
    EXPECT_EQ(Ref<String>(ParserUtils::convertToHTML(none))->utf8(), "");
}

TEST(ParserUtils, MakesNoHTMLOfWhatIsNoUTF8) {
    const Support::LogCapture log;
    EXPECT_EQ(html("a\xFF"), "(null)");
}

TEST(ParserUtils, MeasuresBeforeItWritesHTML) {
    char text[] = "a<b";
    EXPECT_EQ(ParserUtils::_convertToHTML(text, nullptr), 7u);
    char buffer[7];
    EXPECT_EQ(ParserUtils::_convertToHTML(text, buffer), 7u);
    EXPECT_STREQ(buffer, "a&lt;b");
    EXPECT_EQ(ParserUtils::_convertToHTML("", nullptr), 1u);
    EXPECT_EQ(ParserUtils::_convertToHTML(text, text), 0u);
    EXPECT_STREQ(text, "a<b");
}

TEST(ParserUtils, TrimsInPlace) {
    EXPECT_EQ(trimmed(" \t\r\na b\n\r\t "), "a b");
    EXPECT_EQ(trimmed("a"), "a");
    EXPECT_EQ(trimmed(""), "");
    EXPECT_EQ(trimmed(" \n"), "");
    EXPECT_EQ(trimmed("\va\f"), "\va\f");
    char* none = nullptr;
    ParserUtils::trim(&none);
    EXPECT_EQ(none, nullptr);
}

TEST(ParserUtils, DecodesBase64) {
    EXPECT_EQ(base64("Zm9v"), "foo");
    EXPECT_EQ(base64("Zm9vYmFy"), "foobar");
    EXPECT_EQ(base64("Zg=="), "f");
    EXPECT_EQ(base64("Zm8="), "fo");
    EXPECT_EQ(base64("Zm9vYg=="), "foob");
    EXPECT_EQ(base64("AP+/"), std::string("\0\xFF\xBF", 3));
}

TEST(ParserUtils, FindsNothingInLessThanFourCharactersOfBase64) {
    for (const char* text : {"", "Z", "Zm9", "=", "==", "Z=", "Z==", "Z===", "Zg="}) {
        EXPECT_EQ(base64(text), "(none)") << text;
    }
    EXPECT_EQ(base64(nullptr), "(none)");
}

TEST(ParserUtils, CountsPaddingAndQuantaAsTheyStand) {
    EXPECT_EQ(base64("Zm9vY"), "foo") << "what is left of a last quantum is dropped";
    EXPECT_EQ(base64("Zm9vYg"), "foo");
    EXPECT_EQ(base64("Zm9vYg="), "fo") << "the padding is cut all the same";
    EXPECT_EQ(base64("Zg==Zg=="), "f") << "the first = ends the text";
    EXPECT_EQ(base64("Zm9v=="), "f") << "and where it stands alone, that of the quantum before it";
}

TEST(ParserUtils, SkipsNoWhiteSpaceInBase64) {
    EXPECT_NE(base64("Zm9v\nYmFy").substr(3), "bar");
    EXPECT_EQ(base64("Zm9v\nYmFy").size(), 6u);
    EXPECT_EQ(base64("Zm9v\nYmFy").substr(0, 3), "foo");
    EXPECT_EQ(base64("\xFF-_!"), std::string(3, '\0'));
}

TEST(ParserUtils, ReadsDatesWithTheirZones) {
    const AutoreleasePool pool;
    Ref<Date> date;
    Ref<TimeZone> zone;
    EXPECT_TRUE(ParserUtils::parseDate("Sat, 07 Sep 2002 00:00:01 +0100", date, zone));
    EXPECT_EQ(Ref<String>(date->toString())->utf8(), "2002-09-06 23:00:01 +0000");
    EXPECT_EQ(zone->getSecondsFromGMT(0), 3600);
    EXPECT_TRUE(ParserUtils::parseDate("2003-12-13T18:30:02Z", date, zone));
    EXPECT_EQ(Ref<String>(date->toString())->utf8(), "2003-12-13 18:30:02 +0000");
    EXPECT_EQ(zone->getName(), "GMT");
}

TEST(ParserUtils, EmptiesBothHoldersForWhatIsNoDate) {
    const AutoreleasePool pool;
    for (const char* text : {"next week", "", static_cast<const char*>(nullptr)}) {
        Ref<Date> date = Date::date(1);
        Ref<TimeZone> zone = TimeZone::fixedZone(60);
        EXPECT_FALSE(ParserUtils::parseDate(text, date, zone));
        EXPECT_EQ(date.get(), nullptr);
        EXPECT_EQ(zone.get(), nullptr);
    }
}
