#include "Net/BodyReader.h"

#include "Foundation/AutoreleasePool.h"
#include "Net/BodyDecoder.h"
#include "Net/ConnectionLimits.h"
#include "Net/HTTPMessage.h"
#include "NetTest.h"
#include "Support/Coded.h"

#include <gtest/gtest.h>

#include <ostream>
#include <random>
#include <string>

using namespace Orvane;
using Foundation::NetError;
using Foundation::Ref;

namespace {

struct Coding {
    const char* name;
    std::string (*encode)(std::string_view);
};

void PrintTo(const Coding& coding, std::ostream* out) {
    *out << coding.name;
}

constexpr Coding kCodings[] = {
    {"gzip", Support::gzipped},     {"x-gzip", Support::gzipped},      {"GZip", Support::gzipped},
    {"deflate", Support::deflated}, {"Deflate", Support::rawDeflated}, {"br", Support::brotlied},
    {"zstd", Support::zstandarded},
};

/// Text that neither repeats itself nor is noise.
std::string sample(std::size_t size) {
    std::mt19937 random(7);
    std::string text;
    while (text.size() < size) {
        text += std::to_string(random() % 100000) + " ";
    }
    text.resize(size);
    return text;
}

/// What a decoder makes of blocks of that size; "corrupt" or "truncated" where it fails.
std::string decoded(const char* coding, std::string_view input, std::size_t blockSize) {
    const auto decoder = BodyDecoder::forCoding(coding);
    std::string output;
    for (std::size_t i = 0; i < input.size(); i += blockSize) {
        const bool isGood =
            decoder->decode(input.substr(i, blockSize), [&](std::string_view block) {
                EXPECT_LE(block.size(), BodyDecoder::kBlockBytes);
                output += block;
                return true;
            });
        if (!isGood) return "corrupt";
    }
    return decoder->finish() ? output : "truncated";
}

class BodyDecoderTest : public testing::TestWithParam<Coding> {};

TEST_P(BodyDecoderTest, GivesBackWhatWasCoded) {
    const std::string text = sample(300000);
    const std::string coded = GetParam().encode(text);
    EXPECT_LT(coded.size(), text.size());
    for (const std::size_t blockSize : {std::size_t{1}, std::size_t{1000}, coded.size()}) {
        EXPECT_TRUE(decoded(GetParam().name, coded, blockSize) == text) << blockSize;
    }
}

TEST_P(BodyDecoderTest, TakesNothingForNothing) {
    EXPECT_EQ(decoded(GetParam().name, "", 1), "");
    EXPECT_EQ(decoded(GetParam().name, GetParam().encode(""), 1), "");
}

TEST_P(BodyDecoderTest, NoticesWhereAStreamStops) {
    const std::string coded = GetParam().encode(sample(20000));
    for (int tenth = 1; tenth < 10; ++tenth) {
        const std::string_view part = std::string_view(coded).substr(0, coded.size() * tenth / 10);
        EXPECT_EQ(decoded(GetParam().name, part, 512), "truncated") << tenth;
    }
    const std::string_view lacksOne = std::string_view(coded).substr(0, coded.size() - 1);
    EXPECT_EQ(decoded(GetParam().name, lacksOne, coded.size()), "truncated");
    EXPECT_EQ(decoded(GetParam().name, std::string_view(coded).substr(0, 1), 1), "truncated");
}

TEST_P(BodyDecoderTest, NoticesWhatIsNoStream) {
    EXPECT_EQ(decoded(GetParam().name, "\xff\xff<rss>this is no coded text at all</rss>", 100),
              "corrupt");
}

TEST_P(BodyDecoderTest, StopsWhenTheSinkWantsNoMore) {
    const std::string coded = GetParam().encode(sample(300000));
    int calls = 0;
    const auto decoder = BodyDecoder::forCoding(GetParam().name);
    EXPECT_FALSE(decoder->decode(coded, [&](std::string_view) {
        ++calls;
        return false;
    }));
    EXPECT_EQ(calls, 1);
}

TEST_P(BodyDecoderTest, LeavesOutWhatFollowsAStream) {
    if (std::string_view(GetParam().name) == "zstd") return;  // frames only may follow frames
    const std::string text = sample(1000);
    const std::string coded = GetParam().encode(text) + std::string(10, '\0') + "junk";
    EXPECT_EQ(decoded(GetParam().name, coded, 7), text);
}

INSTANTIATE_TEST_SUITE_P(All, BodyDecoderTest, testing::ValuesIn(kCodings));

TEST(BodyDecoder, KnowsNoOtherCodings) {
    EXPECT_EQ(BodyDecoder::forCoding("compress"), nullptr);
    EXPECT_EQ(BodyDecoder::forCoding(""), nullptr);
}

TEST(BodyDecoder, ReadsGzipOfSeveralMembers) {
    const std::string coded = Support::gzipped("one ") + Support::gzipped("two");
    EXPECT_EQ(decoded("gzip", coded, 3), "one two");
    EXPECT_EQ(decoded("gzip", coded.substr(0, coded.size() - 2), 3), "truncated");
}

TEST(BodyDecoder, ReadsZstandardOfSeveralFrames) {
    const std::string coded = Support::zstandarded("one ") + Support::zstandarded("two");
    EXPECT_EQ(decoded("zstd", coded, 3), "one two");
}

TEST(BodyDecoder, NoticesAChangedByte) {
    std::string coded = Support::gzipped(sample(20000));
    coded[coded.size() - 6] = static_cast<char>(coded[coded.size() - 6] ^ 1);  // of the checksum
    EXPECT_EQ(decoded("gzip", coded, 1000), "corrupt");
}

class BodyReaderTest : public testing::Test {
 protected:
    ~BodyReaderTest() noexcept override = default;

    /// Reads a body in blocks; the bytes it gave, and the error.
    std::pair<std::size_t, NetError> read(const std::string& coding, const std::string& body,
                                          bool isDocument = true, int status = 200) {
        std::vector<HTTPHeader> headers;
        if (!coding.empty()) headers.push_back({"Content-Encoding", coding});
        const Ref<HTTPMessage> message = HTTPMessage::response(status, headers);
        BodyReader reader("http://a/", *message, isDocument);
        NetError error = reader.open();
        std::size_t size = 0;
        constexpr std::size_t kBlock = 16384;
        for (std::size_t i = 0; i < body.size() && error.code == 0; i += kBlock) {
            error =
                reader.take(std::string_view(body).substr(i, kBlock), [&](std::string_view block) {
                    size += block.size();
                    return true;
                });
        }
        if (error.code == 0) error = reader.finish();
        return {size, error};
    }

    static constexpr NetError kBad{NetError::kPFURL, -1011};
    Foundation::AutoreleasePool mPool;
    Support::LogCapture mLog;
};

constexpr std::size_t kMiB = std::size_t{1} << 20;

TEST_F(BodyReaderTest, LetsADocumentOf32MiBThrough) {
    EXPECT_EQ(read("", std::string(32 * kMiB, 'x')), (std::pair{32 * kMiB, NetError()}));
}

TEST_F(BodyReaderTest, EndsADocumentOfMore) {
    const auto [size, error] = read("", std::string(32 * kMiB + 1, 'x'));
    EXPECT_EQ(error, kBad);
    EXPECT_LE(size, 32 * kMiB);
    EXPECT_TRUE(mLog.contains("<http://a/>: a body of more than 33554432 bytes"));
}

TEST_F(BodyReaderTest, LetsAFileBeOfAnySize) {
    EXPECT_EQ(read("", std::string(33 * kMiB, 'x'), false).second, NetError());
}

TEST_F(BodyReaderTest, EndsABodyThatDecodesToMoreThan200TimesItsSize) {
    const std::string bomb = Support::gzipped(std::string(8 * kMiB, 'x'));
    ASSERT_GT(8 * kMiB / bomb.size(), 200u);
    const auto [size, error] = read("gzip", bomb);
    EXPECT_EQ(error, kBad);
    EXPECT_LE(size, 4 * kMiB);
    EXPECT_TRUE(mLog.contains("<http://a/>: a body that decodes to more than 200 times its size"));
}

TEST_F(BodyReaderTest, LetsTheFirstMiBDecodeToAnyNumberOfTimesItsSize) {
    EXPECT_EQ(read("gzip", Support::gzipped(std::string(kMiB, 'x'))),
              (std::pair{kMiB, NetError()}));
}

TEST_F(BodyReaderTest, UndoesSeveralCodingsFromTheLastOn) {
    const std::string body = Support::brotlied(Support::gzipped("text"));
    EXPECT_EQ(read("gzip, identity ,br", body), (std::pair<std::size_t, NetError>{4, {}}));
    EXPECT_EQ(read("br, gzip", body).second, kBad);
}

TEST_F(BodyReaderTest, BoundsWhatStandsBetweenTwoCodings) {
    const std::string empty = Support::gzipped("");
    std::string many;
    while (many.size() < 16 * kMiB) {
        many += empty;
    }
    EXPECT_EQ(read("gzip, gzip", Support::gzipped(many)),
              (std::pair<std::size_t, NetError>{0, kBad}));
    EXPECT_TRUE(mLog.contains("<http://a/>: a body that decodes to more than 200 times its size"));
}

TEST_F(BodyReaderTest, RefusesMoreThanThreeCodings) {
    EXPECT_EQ(read("gzip,gzip,gzip,gzip", "").second, kBad);
    EXPECT_TRUE(mLog.contains("<http://a/>: more than 3 content codings"));
}

TEST_F(BodyReaderTest, RefusesCodingsThatItDoesNotKnow) {
    EXPECT_EQ(read("compress", "x").second, kBad);
    EXPECT_TRUE(mLog.contains("<http://a/>: unknown content coding \"compress\""));
}

TEST_F(BodyReaderTest, SaysWhatIsWrongWithACoding) {
    EXPECT_EQ(read("gzip", "no gzip").second, kBad);
    EXPECT_TRUE(mLog.contains("<http://a/>: corrupt content coding"));
    EXPECT_EQ(read("gzip", Support::gzipped("text").substr(0, 15)).second, kBad);
    EXPECT_TRUE(mLog.contains("<http://a/>: truncated content coding"));
}

TEST_F(BodyReaderTest, LeavesAPartOfAFileAsItIs) {
    EXPECT_EQ(read("gzip", "middle", false, 206), (std::pair<std::size_t, NetError>{6, {}}));
}

class CodedRequestTest : public NetTest {};

TEST_F(CodedRequestTest, DecodesTheBody) {
    network().answer("http://a/", {.headers = {{"Content-Encoding", "gzip"}},
                                   .body = Support::gzipped("hello")});
    const auto request = get("http://a/");
    request->start(true);
    turn();
    EXPECT_EQ(request->getResponseData()->view(), "hello");
    EXPECT_TRUE(network().requests()[0].acceptsCodings);
}

TEST_F(CodedRequestTest, FailsWithoutDataWhereACodingIsTruncated) {
    network().answer("http://a/", {.headers = {{"Content-Encoding", "gzip"}},
                                   .body = Support::gzipped("hello").substr(0, 20)});
    const auto request = get("http://a/");
    const RequestRecorder recorder(*request);
    request->start(true);
    turn();
    EXPECT_EQ(recorder.notes.back(), "failed 15 -1011");
    EXPECT_EQ(request->getResponseData(), nullptr);
}

TEST_F(CodedRequestTest, TellsTheStatusWhateverTheCoding) {
    network().answer(
        "http://a/",
        {.status = 404, .headers = {{"Content-Encoding", "utf-8"}}, .body = "not here"});
    const auto request = get("http://a/");
    const RequestRecorder recorder(*request);
    request->start(true);
    turn();
    EXPECT_EQ(recorder.notes,
              (std::vector<std::string>{"opened", "response 404", "failed 15 -1011"}));
}

TEST_F(CodedRequestTest, MindsNoCodingWhereThereIsNoBody) {
    network().answer("http://a/", {.status = 304, .headers = {{"Content-Encoding", "utf-8"}}});
    const auto request = get("http://a/");
    const RequestRecorder recorder(*request);
    request->start(true);
    turn();
    EXPECT_EQ(recorder.notes, (std::vector<std::string>{"opened", "response 304", "finished"}));
}

TEST_F(CodedRequestTest, AsksForNoCodingOfAFile) {
    const auto request = get("http://a/");
    request->setAccumulatesData(false);
    request->start(true);
    turn();
    EXPECT_FALSE(network().requests()[0].acceptsCodings);
    request->stop();
}

}  // namespace
