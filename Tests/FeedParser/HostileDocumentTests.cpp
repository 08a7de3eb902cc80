#include "FeedParser/ParsedDocument.h"
#include "FeedParser/Text/Bounds.h"
#include "Foundation/AutoreleasePool.h"
#include "SQLite/Database.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>
#include <sys/resource.h>
#include <nlohmann/json.hpp>

#include <functional>
#include <string>

using nlohmann::json;
namespace Bounds = Orvane::FeedParser::Bounds;
using Foundation::Data;
using Foundation::Ref;

namespace {

constexpr std::size_t kMiB = 1U << 20;

// What a document of 1 MiB may cost. Builds for finding faults take more.
#if defined(__OPTIMIZE__) && !defined(__SANITIZE_ADDRESS__)
constexpr double kMostSeconds = 2;
constexpr long kMostKilobytes = 400L << 10;
#else
constexpr double kMostSeconds = 20;
constexpr long kMostKilobytes = 2000L << 10;
#endif

std::string repeated(const std::string& text, std::size_t times) {
    std::string all;
    all.reserve(text.size() * times);
    for (std::size_t i = 0; i < times; ++i) {
        all += text;
    }
    return all;
}

/// A feed of 1 MiB, filled with as much of `text` as fits.
std::string filled(const std::string& before, const std::string& text, const std::string& behind) {
    return before + repeated(text, (kMiB - before.size() - behind.size()) / text.size()) + behind;
}

std::string numbered(std::size_t bytes, const std::function<std::string(int)>& make) {
    std::string all;
    for (int i = 0; all.size() < bytes; ++i) {
        all += make(i);
    }
    return all;
}

double processorSeconds() {
    rusage used = {};
    getrusage(RUSAGE_SELF, &used);
    const auto seconds = [](const timeval& t) {
        return static_cast<double>(t.tv_sec) + static_cast<double>(t.tv_usec) / 1e6;
    };
    return seconds(used.ru_utime) + seconds(used.ru_stime);
}

struct Hostile {
    const char* name;
    std::function<std::string()> make;
};

void PrintTo(const Hostile& hostile, std::ostream* out) {
    *out << hostile.name;
}

const char* const kRSS = "<rss><channel>";
const char* const kEnd = "</channel></rss>";

std::string nestedEntities(int levels, const std::string& use) {
    std::string declarations = "<!ENTITY e0 \"lol\">";
    for (int i = 1; i < levels; ++i) {
        declarations += "<!ENTITY e" + std::to_string(i) + " \"" +
                        repeated("&e" + std::to_string(i - 1) + ";", 10) + "\">";
    }
    return "<!DOCTYPE rss [" + declarations + "]>" + kRSS + use + kEnd;
}

const Hostile kHostile[] = {
    {"parameter entities",
     [] {
         std::string d = "<!ENTITY % a0 \"<!ENTITY x 'y'>\">";
         for (int i = 1; i < 5; ++i) {
             d += "<!ENTITY % a" + std::to_string(i) + " \"" +
                  repeated("&#37;a" + std::to_string(i - 1) + ";", 10) + "\">";
         }
         return "<!DOCTYPE rss [" + d + "%a4;]>" + kRSS + kEnd;
     }},
    {"a few parameter entities",
     [] {
         return std::string(
                    "<!DOCTYPE rss [<!ENTITY % a \"<!ENTITY x 'y'>&#37;b;\"><!ENTITY % b "
                    "\"&#37;a;&#37;a;\">%a;]>") +
                kRSS + kEnd;
     }},
    {"a billion laughs", [] { return nestedEntities(10, "<title>&e9;</title>"); }},
    {"a billion laughs in an attribute",
     [] { return nestedEntities(10, "<link href=\"&e9;\"/>"); }},
    {"a million laughs in many attributes",
     [] { return nestedEntities(6, repeated("<link href=\"&e5;\"/>", 40000)); }},
    {"a long entity in many attributes",
     [] {
         return "<!DOCTYPE rss [<!ENTITY a \"" + std::string(60000, 'x') + "\">]>" +
                filled(kRSS, "<link href=\"&a;&a;&a;&a;\"/>", kEnd);
     }},
    {"a long entity in many texts",
     [] {
         return "<!DOCTYPE rss [<!ENTITY a \"" + repeated("<b>x</b>", 7000) + "\">]>" +
                filled(kRSS, "<item><title>&a;&a;&a;&a;</title></item>", kEnd);
     }},
    {"default attributes",
     [] {
         return "<!DOCTYPE rss [<!ATTLIST a " +
                numbered(60000,
                         [](int i) { return "a" + std::to_string(i) + " CDATA \"xxxxxxxx\" "; }) +
                ">]>" + filled(kRSS, "<a/>", kEnd);
     }},
    {"many declarations",
     [] {
         return "<!DOCTYPE rss [<!ATTLIST a " +
                numbered(900000, [](int i) { return "a" + std::to_string(i) + " CDATA \"x\" "; }) +
                ">]>" + kRSS + kEnd;
     }},
    {"a huge attribute",
     [] { return kRSS + ("<link href=\"" + std::string(1000000, 'x')) + "\"/>" + kEnd; }},
    {"many attributes",
     [] {
         return "<rss " + numbered(kMiB, [](int i) { return "a" + std::to_string(i) + "=\"\" "; }) +
                "/>";
     }},
    {"many namespaces",
     [] {
         std::string xml;
         for (int i = 0; i < 200; ++i) {
             xml += "<a ";
             for (int j = 0; j < 250; ++j) {
                 xml += "xmlns:a" + std::to_string(i * 250 + j) + "=\"b\" ";
             }
             xml += ">";
         }
         return kRSS + xml + repeated("<a0:b/>", 50000);
     }},
    {"a hundred thousand elements within each other",
     [] { return kRSS + repeated("<a>", 100000) + repeated("</a>", 100000) + kEnd; }},
    {"entries within each other",
     [] { return repeated("<entry>", 200) + std::string(kMiB, 'x') + repeated("</entry>", 200); }},
    {"authors within each other",
     [] {
         return kRSS + repeated("<author>", 200) + std::string(kMiB - 10000, 'x') +
                repeated("</author>", 200) + kEnd;
     }},
    {"empty elements", [] { return filled(kRSS, "<a/>", kEnd); }},
    {"empty entries", [] { return filled(kRSS, "<item/>", kEnd); }},
    {"empty links", [] { return filled(kRSS, "<link/>", kEnd); }},
    {"empty authors", [] { return filled(kRSS, "<author>a</author>", kEnd); }},
    {"enclosures",
     [] {
         return filled(std::string(kRSS) + "<item>", "<enclosure url=\"http://a/\"/>",
                       "</item></channel></rss>");
     }},
    {"a long base of many links",
     [] {
         return filled("<feed xmlns=\"http://www.w3.org/2005/Atom\" xml:base=\"http://a/" +
                           std::string(500000, 'b') + "/\">",
                       "<entry><link href=\"c\"/></entry>", "</feed>");
     }},
    {"a base that is as long as may be",
     [] {
         return filled("<feed xmlns=\"http://www.w3.org/2005/Atom\" xml:base=\"http://a/" +
                           std::string(2000, 'b') + "/\">",
                       "<entry><link href=\"c\"/></entry>", "</feed>");
     }},
    {"many bases of many links",
     [] { return filled("<html><head>", "<base/><link/>", "</head></html>"); }},
    {"descriptions that cannot be tidied",
     [] {
         const std::string evil = repeated("&lt;font&gt;&lt;p&gt;", 1000);
         return filled(kRSS, "<description>" + evil + "</description>", kEnd);
     }},
    {"a date", [] { return kRSS + ("<pubDate>" + std::string(32768, '1')) + "</pubDate>" + kEnd; }},
    {"ampersands", [] { return filled("<rss><a>", "&", "</a></rss>"); }},
    {"undeclared prefixes", [] { return filled(kRSS, "<a:b/>", kEnd); }},
    {"undeclared entities", [] { return filled(kRSS, "&foo;", kEnd); }},
    {"tags that do not fit", [] { return filled(kRSS, "<a></b>", kEnd); }},
    {"tags without an end", [] { return filled("", "<a b='", ""); }},
    {"comments without an end", [] { return filled("<rss>", "<!--", ""); }},
    {"a page without an end", [] { return filled("<html><head>", "<script>", ""); }},
    {"fonts and paragraphs", [] { return "<html><head>" + repeated("<font><p>", 2000); }},
    {"zeros", [] { return std::string(kMiB, '\0'); }},
    {"ends of tags", [] { return filled("<rss", ">", ""); }},
};

class HostileDocument : public testing::TestWithParam<Hostile> {
 protected:
    HostileDocument() { SQLite::Database::initialize(); }
    ~HostileDocument() noexcept override {}

    Foundation::AutoreleasePool pool;
    Support::LogCapture log;
};

TEST_P(HostileDocument, CostsLittle) {
    const std::string document = GetParam().make();
    // Some of them are a little more than 1 MiB.
    ASSERT_LT(document.size(), 2 * kMiB);
    const double before = processorSeconds();
    {
        const Foundation::AutoreleasePool inner;
        const Ref<Data> data = Data::data(document.data(), document.size(), false);
        const Orvane::FeedParser::Parser parser(data.get(), nullptr);
    }
    EXPECT_LT(processorSeconds() - before, kMostSeconds);
    rusage used = {};
    getrusage(RUSAGE_SELF, &used);
    EXPECT_LT(used.ru_maxrss, kMostKilobytes);
}
INSTANTIATE_TEST_SUITE_P(All, HostileDocument, testing::ValuesIn(kHostile));

class HostileDocuments : public testing::Test {
 protected:
    HostileDocuments() { SQLite::Database::initialize(); }
    ~HostileDocuments() noexcept override {}

    Foundation::AutoreleasePool pool;
    Support::LogCapture log;
    Support::LoggingOn on{{&Orvane::gLogParser}};
};

TEST_F(HostileDocuments, AreNotParsedFurtherThanTheirBoundsReach) {
    EXPECT_EQ(parsed(kRSS + repeated("<a/>", 2500000) + kEnd)["kind"], "unknown");
    EXPECT_TRUE(log.contains("A document has reached the bound \"tags\""));
}

TEST_F(HostileDocuments, KeepTheEntriesThatAFeedMayHave) {
    const json found = parsed(kRSS + repeated("<item/>", Bounds::kEntries + 10) + kEnd);
    EXPECT_EQ(found["kind"], "feed");
    EXPECT_EQ(found["entries"].size(), Bounds::kEntries);
    EXPECT_TRUE(log.contains("\"entries\""));
}

TEST_F(HostileDocuments, KeepTheEnclosuresThatAnEntryMayHave) {
    const json found = parsed(std::string(kRSS) + "<item>" +
                              repeated("<enclosure url=\"http://a/\"/>", Bounds::kEnclosures + 1) +
                              "</item>" + kEnd);
    EXPECT_EQ(valueAt(found, "entries[0].enclosures.count"), Bounds::kEnclosures);
    EXPECT_TRUE(log.contains("\"enclosures\""));
}

TEST_F(HostileDocuments, AreReadWithoutTheDeclarationsThatWereCut) {
    const json found =
        parsed("<!DOCTYPE rss [<!ENTITY % a 'b'>" + repeated("%a;", Bounds::kSubsetPercents) +
               "]>" + kRSS + "<title>T</title>" + kEnd);
    EXPECT_EQ(found["feed"]["title"], "T");
    EXPECT_EQ(found["attempts"], 1);
}

TEST_F(HostileDocuments, AreStoppedAfterTooManyErrorsAndRepaired) {
    const json found = parsed(kRSS + std::string("<title>T</title>") +
                              repeated("<x:y/>", Bounds::kParserErrors + 100) + kEnd);
    EXPECT_EQ(log.count("\"errors\""), 1);
    EXPECT_EQ(found["feed"]["title"], "T");
    EXPECT_EQ(found["attempts"], 2);
}

TEST_F(HostileDocuments, ExpandEntitiesInAttributesUpToABound) {
    const std::string link = "<link href=\"http://a/" + repeated("&a;", 500) + "\"/>";
    const json found = parsed("<!DOCTYPE rss [<!ENTITY a \"" + std::string(2000, 'x') + "\">]>" +
                              kRSS + link + link + kEnd);
    const std::string href = valueAt(found, "info.links[0].href");
    EXPECT_GT(href.size(), Bounds::kEntityBytes - 10000);
    EXPECT_LT(href.size(), Bounds::kEntityBytes + 10000);
    EXPECT_EQ(valueAt(found, "info.links[1].href"), "http://a/");
    EXPECT_EQ(log.count("\"bytes of entities\""), 1);
}

TEST_F(HostileDocuments, GetNoMoreRawXMLThanTheirBoundAllows) {
    const json found = parsed(std::string(repeated("<entry>", 100)) + std::string(kMiB, 'x') +
                              repeated("</entry>", 100));
    EXPECT_EQ(found["kind"], "entry");
    EXPECT_TRUE(log.contains("\"bytes of raw XML\""));
}

}  // namespace
