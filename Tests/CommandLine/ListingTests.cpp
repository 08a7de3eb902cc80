#include "CommandLine/Listing.h"

#include "CommandLine/ListingJSON.h"
#include "CommandLine/ListingText.h"

#include <gmock/gmock.h>
#include <nlohmann/json.hpp>

#include <sstream>

using Commands::Listing;
using Kind = Listing::Column::Kind;
using testing::HasSubstr;
using testing::Not;
namespace Text = Commands::ListingText;
namespace InJSON = Commands::ListingJSON;

namespace {

Listing example() {
    Listing listing{"things",
                    {{"id", "ID", Kind::Identifier},
                     {"count", "COUNT", Kind::Number},
                     {"title", "TITLE", Kind::Flexible},
                     {"when", "WHEN"},
                     {"hidden"}},
                    {}};
    const std::string id(33, '0');
    listing.rows.push_back(
        {{"aaaaaaa" + id, 5LL, std::string("One\tthing"), OVDate(0), true}, Listing::Style::Bad});
    listing.rows.push_back({{"bbbbbbb" + id, 12LL, std::string("Another"), {}, false}});
    return listing;
}

Text::Look look(std::size_t width, bool hasColours = false) {
    return {width, hasColours, OVDate(120)};
}

}  // namespace

TEST(Listing, IsATableForPeople) {
    EXPECT_EQ(Text::table(example(), look(80)),
              "ID       COUNT  TITLE      WHEN\n"
              "aaaaaaa      5  One thing  2 min ago\n"
              "bbbbbbb     12  Another\n");
}

TEST(Listing, FitsTheTerminal) {
    std::istringstream lines(Text::table(example(), look(35)));
    for (std::string line; std::getline(lines, line);) {
        EXPECT_LE(line.size(), 35U + 2) << line;  // the dots are three bytes
    }
    EXPECT_THAT(Text::table(example(), look(35)), HasSubstr("One thi\u2026"));
}

TEST(Listing, HasColoursOnlyOnRequest) {
    EXPECT_THAT(Text::table(example(), look(80, true)), HasSubstr("\033[31maaaaaaa"));
    EXPECT_THAT(Text::table(example(), look(80, false)), Not(HasSubstr("\033")));
}

TEST(Listing, IsLinesWithTabsInAPipe) {
    const std::string id(33, '0');
    EXPECT_EQ(Text::lines(example()), "aaaaaaa" + id + "\t5\tOne thing\t2001-01-01T00:00:00Z\n" +
                                          "bbbbbbb" + id + "\t12\tAnother\t\n");
}

TEST(Listing, ShowsAsMuchOfIdentifiersAsTellsThemApart) {
    EXPECT_EQ(Text::identifierLength({"abcdefghij", "zzz"}), 7U);
    EXPECT_EQ(Text::identifierLength({"abcdefghij", "abcdefghxx", "b"}), 9U);
    EXPECT_EQ(Text::identifierLength({"abcdefghij", "abcdefghij"}), 7U);
    EXPECT_EQ(Text::identifierLength({}), 7U);
}

TEST(Listing, ShowsSizesAsPeopleReadThem) {
    const auto shown = [](long long bytes) { return Text::shown(bytes, Kind::Bytes, OVDate(0)); };
    EXPECT_EQ(shown(999), "999 bytes");
    EXPECT_EQ(shown(1500), "1.5 kB");
    EXPECT_EQ(shown(500000000), "500.0 MB");
    EXPECT_EQ(Text::plain(0.5), "0.5");
    EXPECT_EQ(Text::plain(3.0), "3");
    EXPECT_EQ(Text::plain(true), "yes");
}

TEST(Listing, IsOneJSONDocument) {
    const auto json = nlohmann::json::parse(InJSON::document(example()));
    EXPECT_EQ(json["schema"], 1);
    ASSERT_EQ(json["things"].size(), 2U);
    EXPECT_EQ(json["things"][0]["title"], "One\tthing");
    EXPECT_EQ(json["things"][0]["when"], "2001-01-01T00:00:00Z");
    EXPECT_EQ(json["things"][0]["hidden"], true);
    EXPECT_TRUE(json["things"][1]["when"].is_null());
    EXPECT_EQ(json["things"][1]["count"], 12);
    Listing empty = example();
    empty.rows.clear();
    EXPECT_EQ(nlohmann::json::parse(InJSON::document(empty))["things"], nlohmann::json::array());
}

TEST(Listing, IsAJSONObjectALine) {
    Listing listing = example();
    listing.rows[1].values[2] = std::string("line\u2028end\xFF");
    listing.rows[1].values[4] = std::vector<std::string>{"a", "b"};
    std::istringstream lines(InJSON::lines(listing));
    std::string line;
    std::getline(lines, line);
    EXPECT_EQ(nlohmann::json::parse(line)["schema"], 1);
    std::getline(lines, line);
    EXPECT_THAT(line, HasSubstr("line\\u2028end\uFFFD"));
    EXPECT_EQ(nlohmann::json::parse(line)["hidden"], nlohmann::json({"a", "b"}));
    EXPECT_FALSE(std::getline(lines, line));
    EXPECT_EQ(nlohmann::json::parse(InJSON::object(listing))["count"], 5);
}
