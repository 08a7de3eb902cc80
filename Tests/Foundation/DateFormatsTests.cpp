#include "Foundation/DateFormats.h"

#include "Foundation/DateParser.h"
#include "Foundation/PlainDateParser.h"

#include <Orvane/OVFormat.h>
#include <gtest/gtest.h>

#include <random>
#include <string>

using namespace Foundation;

namespace {

/// What `parsedatelite` finds, as text.
std::string found(const std::string& text) {
    GregorianDate date;
    std::uint32_t mask = 0;
    char zoneName[16];
    std::int32_t offset = 0;
    if (!parsedatelite(text.c_str(), date, mask, zoneName, sizeof zoneName, offset)) return "none";
    return OVFormat("%d-%d-%d %d:%d:%g mask %u offset %d", date.year, date.month, date.day,
                    date.hour, date.minute, date.second, mask, offset);
}

template <class Field>
Field field(std::int32_t part) {
    return static_cast<Field>(part == -1 ? 0 : part);
}

/// The same by the plain parser.
std::string expected(const std::string& text) {
    const std::optional<DateParts> p = PlainDateParser::parse(text);
    if (!p) return "none";
    std::uint32_t mask = 0;
    std::uint32_t bit = 1;
    for (const std::int32_t part : {p->year, p->month, p->day, p->hour, p->minute, p->second}) {
        if (part != -1) mask |= bit;
        bit *= 2;
    }
    auto hour = field<std::int8_t>(p->hour);
    if (p->hour != -1 && p->meridian != -1) {
        hour = static_cast<std::int8_t>(hour + p->meridian);
    }
    const auto offset = static_cast<std::int32_t>(static_cast<std::uint32_t>(p->offsetMinutes) *
                                                  (p->offsetMinutes == -1 ? 1u : 60u));
    return OVFormat("%d-%d-%d %d:%d:%g mask %u offset %d", field<std::int32_t>(p->year),
                    field<std::int8_t>(p->month), field<std::int8_t>(p->day), hour,
                    field<std::int8_t>(p->minute),
                    static_cast<double>(field<std::int32_t>(p->second)), mask, offset);
}

class Texts {
 public:
    explicit Texts(unsigned seed) : mRandom(seed) {}

    /// Any row of up to a dozen pieces.
    std::string pieces() {
        std::string text;
        for (unsigned n = pick(13); n > 0; --n)
            text += piece();
        return text;
    }

    /// A text of one of the formats, now and then with something wrong.
    std::string ofFormat(std::string_view format) {
        std::string text;
        bool isOptional = false;
        for (const char item : format) {
            if (item == '[' || item == ']') {
                isOptional = item == '[';
            } else if (!isOptional || pick(2) == 0) {
                text += pick(60) == 0 ? piece() : ofItem(item);
            }
        }
        return text;
    }

 private:
    unsigned pick(unsigned n) { return mRandom() % n; }
    template <std::size_t N>
    std::string oneOf(const char* const (&list)[N]) {
        return list[pick(N)];
    }

    std::string numberUpTo(unsigned n) {
        return std::to_string(pick(n + 1)) + (pick(2) ? "" : " ");
    }

    std::string piece() {
        static const char* const kPieces[] = {
            " ",    " ",         ",",          ":",           ":",    ".",    "-",  "/",
            "+",    "T",         "Z",          "GMT ",        "EST ", "EDT ", "pm", "am ",
            "Jan",  "february ", "Fri",        "monday ",     "st ",  "week", "12", "31 ",
            "2005", "99 ",       "-5",         "+0130",       "-0",   "-12",  "7",  "0",
            "59",   "60",        "4294967295", "2147483648 ", "(c)"};
        return oneOf(kPieces);
    }

    std::string ofItem(char item) {
        static const char* const kDays[] = {"Sun", "Monday", "tues"};
        static const char* const kMonths[] = {"Jan", "FEB.", "march ", "Sept ", "dec", "2", "11 "};
        static const char* const kYears[] = {"2005", "04",   "37 ",   "38",
                                             "300",  "1900", "1999 ", "2100"};
        static const char* const kZones[] = {"GMT",    "Z",     "EST",   "EDT", "EST EDT", "+0100",
                                             "-05:30", "-1:59", "GMT+2", "-0",  "130"};
        switch (item) {
            case 'A':
                return oneOf(kDays);
            case 'B':
                return oneOf(kMonths);
            case 'd':
                return numberUpTo(32) + (pick(4) == 0 ? "th" : "");
            case 'm':
                return numberUpTo(13);
            case 'H':
                return numberUpTo(24);
            case 'M':
                return numberUpTo(60);
            case 'S':
                return numberUpTo(60) + (pick(4) == 0 ? ".25 " : "");
            case 'Y':
            case 'y':
                return oneOf(kYears);
            case 'p':
                return pick(2) ? " am" : "p.m.";
            case 't':
                return "T";
            case 'Z':
                return oneOf(kZones);
            case '-':
                return pick(3) == 0 ? "/" : "-";
            default:
                return std::string(1, item);
        }
    }

    std::mt19937 mRandom;
};

}  // namespace

TEST(DateFormats, FindWhatAPlainWalkFindsInAnyPieces) {
    const unsigned seed = std::random_device()();
    SCOPED_TRACE(seed);
    Texts texts(seed);
    for (int i = 0; i < 20000; ++i) {
        const std::string text = texts.pieces();
        ASSERT_EQ(found(text), expected(text)) << text;
    }
}

TEST(DateFormats, FindWhatAPlainWalkFindsInTextsOfEachFormat) {
    const unsigned seed = std::random_device()();
    SCOPED_TRACE(seed);
    Texts texts(seed);
    int dates = 0;
    for (const std::string_view format : PlainDateParser::formats()) {
        for (int i = 0; i < 300; ++i) {
            const std::string text = texts.ofFormat(format);
            ASSERT_EQ(found(text), expected(text)) << text;
            dates += found(text) != "none";
        }
    }
    EXPECT_GT(dates, 60 * 300 / 4) << "the texts are no dates";
}

TEST(DateFormats, AreSixtyOfWhichTheLastRepeatsTheEighth) {
    ASSERT_EQ(dateFormats().size(), 60u);
    ASSERT_EQ(PlainDateParser::formats().size(), 60u);
    EXPECT_EQ(PlainDateParser::formats()[59], PlainDateParser::formats()[7]);
    DateTokens tokens;
    DateParts parts;
    ASSERT_TRUE(tokens.read("Fri, 2 Jan, 3:04:05 2006, pm, GMT", nullptr, 0));
    EXPECT_TRUE(dateFormats()[7].match(tokens, parts));
    EXPECT_TRUE(dateFormats()[59].match(tokens, parts));
}
