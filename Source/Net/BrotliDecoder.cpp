#include "Net/BrotliDecoder.h"

#include <brotli/decode.h>

#include <array>
#include <cstdint>
#include <new>

namespace Orvane {

void BrotliDecoder::StateDeleter::operator()(BrotliDecoderStateStruct* state) const {
    BrotliDecoderDestroyInstance(state);
}

BrotliDecoder::BrotliDecoder() : mState(BrotliDecoderCreateInstance(nullptr, nullptr, nullptr)) {
    if (!mState) throw std::bad_alloc();
}

BrotliDecoder::~BrotliDecoder() = default;

bool BrotliDecoder::decode(std::string_view input, const Sink& sink) {
    if (input.empty() || mIsComplete) return true;
    mIsEmpty = false;
    std::array<char, kBlockBytes> block;
    const auto* next = reinterpret_cast<const std::uint8_t*>(input.data());
    std::size_t left = input.size();
    BrotliDecoderResult result;
    do {
        auto* out = reinterpret_cast<std::uint8_t*>(block.data());
        std::size_t room = block.size();
        result = BrotliDecoderDecompressStream(mState.get(), &left, &next, &room, &out, nullptr);
        if (result == BROTLI_DECODER_RESULT_ERROR) return false;
        const std::size_t length = block.size() - room;
        if (length > 0 && !sink({block.data(), length})) return false;
    } while (result == BROTLI_DECODER_RESULT_NEEDS_MORE_OUTPUT);
    mIsComplete = result == BROTLI_DECODER_RESULT_SUCCESS;
    return true;
}

}  // namespace Orvane
