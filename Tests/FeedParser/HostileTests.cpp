#include "FeedParser/HostileDocuments.h"

#include "FeedParser/Info.h"
#include "Support/ChildProcess.h"
#include "Support/TempDir.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <sstream>
#include <string>
#include <vector>

/// Each hostile document is read by a process of its own, whose processor time and memory are
/// looked at.

namespace {

using Orvane::FeedParser::Info;
using Support::ChildResult;

constexpr std::size_t kMiB = 1 << 20;
#ifdef __OPTIMIZE__
constexpr double kProcessorSeconds = 2;
#else
// Our own code takes several times as long as it is without optimisation.
constexpr double kProcessorSeconds = 5;
#endif
constexpr std::size_t kMemory = 400 * kMiB;

void expectCheap(const ChildResult& result) {
    EXPECT_EQ(result.status, 0) << result.out << result.err.substr(0, 2000);
    // Sanitizers cost several times that of both.
#ifndef __SANITIZE_ADDRESS__
    EXPECT_LE(result.processorSeconds, kProcessorSeconds);
    EXPECT_LE(result.peakBytes, kMemory);
#endif
}

ChildResult read(const std::string& document) {
    const Support::TempDir folder;
    return Support::runChild({ORVANE_HOSTILE_READER, folder.writeFile("document", document)});
}

class HostileDocuments : public testing::TestWithParam<HostileDocument> {};

TEST_P(HostileDocuments, AreReadOrRefusedCheaply) {
    const std::string document = GetParam().make();
    ASSERT_LE(document.size(), kMiB);
    ASSERT_GT(document.size(), 100U);
    expectCheap(read(document));
}

class LargeDocuments : public HostileDocuments {};

TEST_P(LargeDocuments, DoNotBloatTheProcess) {
    expectCheap(read(GetParam().make()));
}

/// The first few; all where `ORVANE_SLOW_TESTS` is set.
std::vector<HostileDocument> documentsOf(const std::string& family) {
    constexpr std::size_t kFew = 4;
    for (const HostileFamily& each : hostileFamilies()) {
        if (each.name != family) continue;
        std::vector<HostileDocument> documents = each.documents;
        const bool isSlow = std::getenv("ORVANE_SLOW_TESTS") != nullptr;
        if (!isSlow && documents.size() > kFew) documents.resize(kFew);
        return documents;
    }
    return {};
}

std::string nameOf(const testing::TestParamInfo<HostileDocument>& info) {
    return info.param.name;
}

INSTANTIATE_TEST_SUITE_P(EntityBombs, HostileDocuments,
                         testing::ValuesIn(documentsOf("EntityBombs")), nameOf);
INSTANTIATE_TEST_SUITE_P(Nestings, HostileDocuments, testing::ValuesIn(documentsOf("Nestings")),
                         nameOf);
INSTANTIATE_TEST_SUITE_P(Tidying, HostileDocuments, testing::ValuesIn(documentsOf("Tidying")),
                         nameOf);
INSTANTIATE_TEST_SUITE_P(Crowds, HostileDocuments, testing::ValuesIn(documentsOf("Crowds")),
                         nameOf);
INSTANTIATE_TEST_SUITE_P(LongTexts, HostileDocuments, testing::ValuesIn(documentsOf("LongTexts")),
                         nameOf);
INSTANTIATE_TEST_SUITE_P(Sizes, LargeDocuments, testing::ValuesIn(documentsOf("Sizes")), nameOf);

/// What the reader says of a document.
struct Reading {
    explicit Reading(const ChildResult& result) {
        std::istringstream words(result.out);
        words >> kind >> entries >> title;
    }
    int kind = -1;
    int entries = -1;
    std::string title;
};

TEST(HostileReading, OpensNoFileThatADocumentNames) {
    const Support::TempDir folder;
    const std::string secret = folder.writeFile("secret", "<!ENTITY s \"secret\"> secret");
    const std::string documents[] = {
        "<!DOCTYPE rss [<!ENTITY s SYSTEM \"file://" + secret + "\">]>" +
            "<rss><channel><title>T&s;</title></channel></rss>",
        "<!DOCTYPE rss SYSTEM \"file://" + secret + "\">" +
            "<rss><channel><title>T&s;</title></channel></rss>",
        "<!DOCTYPE rss [<!ENTITY % p SYSTEM \"" + secret + "\">%p;]>" +
            "<rss><channel><title>T&s;</title></channel></rss>",
    };
    for (const std::string& document : documents) {
        const ChildResult result = read(document);
        const Reading reading(result);
        EXPECT_EQ(reading.kind, Info::FeedKind) << document;
        EXPECT_EQ(result.out.find("secret"), std::string::npos) << result.out;
        expectCheap(result);
    }
}

TEST(HostileReading, ReadsWhatALongDocumentHasAll) {
    std::string document = "<rss><channel><title>Title</title>";
    for (int i = 0; i < 5000; ++i)
        document += "<item><title>x</title><description>&lt;p>" + std::string(100, 'y') +
                    "</description></item>";
    const ChildResult result = read(document + "</channel></rss>");
    const Reading reading(result);
    EXPECT_EQ(reading.kind, Info::FeedKind);
    EXPECT_EQ(reading.entries, 5000);
    EXPECT_EQ(reading.title, "Title");
    expectCheap(result);
}

}  // namespace
