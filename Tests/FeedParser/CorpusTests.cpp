#include "FeedParser/ParsedDocument.h"

#include "SQLite/Database.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <cctype>
#include <cstdlib>
#include <fstream>
#include <sstream>
#include <string>

using nlohmann::json;

namespace {

std::string contentOf(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    std::stringstream content;
    content << file.rdbuf();
    return content.str();
}

/// A folder of the corpus with what is expected of its documents.
class CorpusTest : public testing::Test {
 protected:
    void SetUp() override {
        const char* corpus = std::getenv("ORVANE_CORPUS");
        if (!corpus) GTEST_SKIP() << "ORVANE_CORPUS is not set";
        mCorpus = corpus;
        SQLite::Database::initialize();
    }

    json read(const std::string& path) const {
        return json::parse(contentOf(mCorpus + "/" + path));
    }
    json parse(const std::string& path, const json& expectation = json::object()) const {
        const std::string url = expectation.value("url", std::string());
        const std::string document = contentOf(mCorpus + "/" + path);
        EXPECT_FALSE(document.empty()) << path;
        return parsed(document, url.empty() ? nullptr : url.c_str());
    }

    std::string mCorpus;
};

/// Markup may stand between words instead of white space.
std::string withoutBlanks(std::string text) {
    std::erase_if(text, [](unsigned char c) { return std::isspace(c); });
    return text;
}

/// Text that is not there and text that is empty are the same to the corpus.
bool isNothing(const json& value) {
    return value.is_null() || value == "";
}

bool agree(const json& expected, const json& found, const std::string& how) {
    if (expected == found) return true;
    if (isNothing(expected) && isNothing(found)) return true;
    if (how == "null-or-empty") return isNothing(found);
    if (how != "text" || !expected.is_string() || !found.is_string()) return false;
    return withoutBlanks(wordsOf(expected)) == withoutBlanks(wordsOf(found));
}

/// Counts what a class of expectations comes to.
struct Score {
    int held = 0;
    int all = 0;
    std::string failures;

    void count(bool holds, const std::string& what) {
        ++all;
        if (holds) {
            ++held;
        } else {
            failures += what + "\n";
        }
    }
    double share() const { return all == 0 ? 1 : static_cast<double>(held) / all; }
};

std::string difference(const std::string& file, const std::string& path, const json& expected,
                       const json& found) {
    return file + ": " + path + " is " + found.dump().substr(0, 300) + ", not " +
           expected.dump().substr(0, 300);
}

constexpr double kSoftShare = 0.95;

void expectScores(const Score& gate, const Score& soft) {
    EXPECT_EQ(gate.held, gate.all) << gate.failures;
    EXPECT_GE(soft.share(), kSoftShare) << soft.failures;
    std::cout << "gate " << gate.held << "/" << gate.all << ", soft " << soft.held << "/"
              << soft.all << "\n";
    if (std::getenv("ORVANE_SHOW_SOFT")) std::cout << soft.failures;
}

using DocumentCorpus = CorpusTest;
using ValidatorCorpus = CorpusTest;
using RealCorpus = CorpusTest;
using PageCorpus = CorpusTest;
using FriendCorpus = CorpusTest;

TEST_F(DocumentCorpus, GivesTheExpectedValues) {
    Score gate;
    Score soft;
    const json expected = read("documents/expectations.json");
    for (const json& e : expected) {
        const std::string file = e["file"];
        const std::string path = e["path"];
        const json found = valueAt(parse("documents/" + file, e), path);
        Score& score = e["level"] == "gate" ? gate : soft;
        score.count(agree(e["expected"], found, e["compare"]),
                    difference(file, path, e["expected"], found));
    }
    expectScores(gate, soft);
}

/// Compares kind, format, number of entries and title, whatever of them is expected.
void countKinds(const json& e, const json& found, Score& score) {
    for (const auto& [key, path] :
         {std::pair("kind", "kind"), std::pair("format", "format"),
          std::pair("entries", "entries.count"), std::pair("title", "feed.title"),
          std::pair("attempts", "attempts")}) {
        if (!e.contains(key)) continue;
        const json value = valueAt(found, path);
        const json wanted = e[key] == "none" ? json("unknown") : e[key];
        score.count(agree(wanted, value, "exact"), difference(e["file"], path, e[key], value));
    }
}

TEST_F(DocumentCorpus, FindsTheKindOfEachDocument) {
    Score gate;
    const json expected = read("documents/kinds.json");
    for (const json& e : expected) {
        countKinds(e, parse("documents/" + std::string(e["file"]), e), gate);
    }
    expectScores(gate, {});
}

TEST_F(ValidatorCorpus, FindsTheKindOfEachDocument) {
    Score gate;
    Score soft;
    const json expected = read("validator/kinds.json");
    for (const json& e : expected) {
        const bool isGate = e["level"] == "gate";
        // What a repair gave up on there may be read here.
        if (!isGate && e["kind"] == "none") continue;
        countKinds(e, parse("validator/" + std::string(e["file"])), isGate ? gate : soft);
    }
    expectScores(gate, soft);
}

TEST_F(RealCorpus, GivesTheExpectedValues) {
    Score gate;
    Score soft;
    const json expected = read("real/expected.json");
    for (const auto& [file, e] : expected.items()) {
        const json found = parse("real/files/" + file);
        Score& score = e["level"] == "gate" ? gate : soft;
        const json kind = e["kind"] == "none" ? json("unknown") : e["kind"];
        if (e["level"] == "gate" || e["kind"] != "none") {
            score.count(kind == found["kind"], difference(file, "kind", kind, found["kind"]));
        }
        for (const json& check : e["checks"]) {
            const std::string path = check["path"];
            const json value = valueAt(found, path);
            score.count(agree(check["expected"], value, check["how"]),
                        difference(file, path, check["expected"], value));
        }
    }
    expectScores(gate, soft);
}

/// Links by what is expected of them. XML has blanks where a page has line feeds in an attribute.
json comparable(const json& links) {
    json all = json::array();
    for (const json& link : links) {
        json kept;
        for (const char* key : {"rel", "type", "title", "href", "kind"}) {
            kept[key] = link[key];
        }
        if (kept["title"].is_string()) kept["title"] = withoutBlanks(kept["title"]);
        all.push_back(kept);
    }
    return all;
}

TEST_F(PageCorpus, FindsAllLinks) {
    Score gate;
    const json expected = read("pages/expected.json");
    for (const auto& [file, e] : expected.items()) {
        const json page = parse("pages/files/" + file)["page"];
        const json found = page.is_null() ? json::array() : comparable(page["links"]);
        const json wanted = comparable(e["links"]);
        gate.count(wanted == found, file + ": " + found.dump() + "\nexpected " + wanted.dump());
    }
    expectScores(gate, {});
}

TEST_F(FriendCorpus, GivesTheExpectedValues) {
    Score gate;
    const json expected = read("foaf/expected.json");
    for (const auto& [file, e] : expected.items()) {
        const json found = parse("foaf/files/" + file);
        for (const auto& [key, path] :
             {std::pair("/kind", "kind"), std::pair("/attempts", "attempts"),
              std::pair("/feed/title", "feed.title"),
              std::pair("/feed/alternateUrl", "feed.alternateUrl"),
              std::pair("/feed/entries", "entries.count"),
              std::pair("/friend/family", "friend.familyName"),
              std::pair("/friend/given", "friend.firstName"),
              std::pair("/friend/homepage", "friend.url"), std::pair("/friend/nick", "friend.nick"),
              std::pair("/friend/name", "friend.name"),
              std::pair("/friend/knows", "friend.knows")}) {
            const json::json_pointer pointer(key);
            if (!e.contains(pointer)) continue;
            const json value = valueAt(found, path);
            gate.count(agree(e[pointer], value, "exact"),
                       difference(file, path, e[pointer], value));
        }
    }
    expectScores(gate, {});
}

}  // namespace
