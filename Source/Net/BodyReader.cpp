#include "Net/BodyReader.h"

#include "Foundation/Logger.h"
#include "Net/HTTPMessage.h"

#include <algorithm>
#include <utility>

namespace Orvane {

using Foundation::NetError;

namespace {

constexpr int kPartialContent = 206;
constexpr int kFirstRedirect = 300;

/// The elements of a list of tokens, but for "identity", which is no coding.
std::vector<std::string> codingsIn(std::string_view list) {
    std::vector<std::string> codings;
    std::string token;
    const auto add = [&] {
        if (!token.empty() && !HTTPMessage::isSameName(token, "identity")) codings.push_back(token);
        token.clear();
    };
    for (const char c : list) {
        if (c == ',') {
            add();
        } else if (c != ' ' && c != '\t') {
            token += c;
        }
    }
    add();
    return codings;
}

}  // namespace

BodyReader::BodyReader(std::string url, const HTTPMessage& response, bool isDocument)
    : mURL(std::move(url)),
      mIsDocument(isDocument),
      mIsSuccess(response.getStatus() < kFirstRedirect) {
    // A part of a coded file cannot be decoded alone.
    if (!isDocument && response.getStatus() == kPartialContent) return;
    mCodings = codingsIn(response.getHeader("Content-Encoding"));
}

BodyReader::~BodyReader() = default;

NetError BodyReader::open() {
    mTrouble = findDecoders();
    if (mTrouble.empty()) return {};
    mDecoders.clear();
    // What is not asked for its body is good for its status, as long as no body comes.
    return mIsSuccess ? fail(mTrouble) : NetError();
}

/// What is wrong with the codings; empty for nothing.
std::string BodyReader::findDecoders() {
    if (mCodings.size() > ConnectionLimits::kMaxContentCodings) {
        return OVFormat("more than %zu content codings", ConnectionLimits::kMaxContentCodings);
    }
    for (auto coding = mCodings.rbegin(); coding != mCodings.rend(); ++coding) {
        mDecoders.push_back(BodyDecoder::forCoding(*coding));
        if (!mDecoders.back()) return OVFormat("unknown content coding \"%s\"", *coding);
    }
    return {};
}

NetError BodyReader::take(std::string_view block, const Sink& sink) {
    if (decode(0, block, sink) || mIsRefused) return {};
    return fail(mTrouble.empty() ? "corrupt content coding" : mTrouble);
}

bool BodyReader::decode(std::size_t step, std::string_view block, const Sink& sink) {
    if (!count(step, block)) return false;
    if (step < mDecoders.size()) {
        return mDecoders[step]->decode(
            block, [&](std::string_view output) { return decode(step + 1, output, sink); });
    }
    if (sink(block)) return true;
    mIsRefused = true;
    return false;
}

/// Whether the block may come on top of what has come to this step. What one coding makes of a body
/// has its bounds even where the next makes little of it again.
bool BodyReader::count(std::size_t step, std::string_view block) {
    using namespace ConnectionLimits;
    mBytes[step] += block.size();
    const std::size_t bytes = mBytes[step];
    if (mIsDocument && bytes > kMaxDocumentBytes) {
        mTrouble = OVFormat("a body of more than %zu bytes", kMaxDocumentBytes);
    } else if (bytes > kFreeDecodedBytes && bytes / kMaxDecodedRatio > mBytes[0]) {
        mTrouble =
            OVFormat("a body that decodes to more than %zu times its size", kMaxDecodedRatio);
    }
    return mTrouble.empty();
}

NetError BodyReader::finish() {
    const bool isComplete =
        std::ranges::all_of(mDecoders, [](const auto& decoder) { return decoder->finish(); });
    return isComplete ? NetError() : fail("truncated content coding");
}

NetError BodyReader::fail(const std::string& what) {
    Foundation::gWarn.log("<%s>: %s", mURL, what);
    return {NetError::kPFURL, OVURLErrorBadServerResponse};
}

}  // namespace Orvane
