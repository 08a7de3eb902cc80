#include "Net/ZstdDecoder.h"

#include <zstd.h>

#include <array>
#include <new>

namespace Orvane {

namespace {

/// 8 MiB: RFC 9659, 3.
constexpr int kMaxWindowLog = 23;

}  // namespace

void ZstdDecoder::ContextDeleter::operator()(ZSTD_DCtx_s* context) const {
    ZSTD_freeDCtx(context);
}

ZstdDecoder::ZstdDecoder() : mContext(ZSTD_createDCtx()) {
    if (!mContext) throw std::bad_alloc();
    ZSTD_DCtx_setParameter(mContext.get(), ZSTD_d_windowLogMax, kMaxWindowLog);
}

ZstdDecoder::~ZstdDecoder() = default;

bool ZstdDecoder::decode(std::string_view input, const Sink& sink) {
    std::array<char, kBlockBytes> block;
    ZSTD_inBuffer in = {input.data(), input.size(), 0};
    bool isFull = false;
    while (in.pos < in.size || isFull) {
        ZSTD_outBuffer out = {block.data(), block.size(), 0};
        const std::size_t left = ZSTD_decompressStream(mContext.get(), &out, &in);
        if (ZSTD_isError(left)) return false;
        if (out.pos > 0 && !sink({block.data(), out.pos})) return false;
        mIsAtEnd = left == 0;
        isFull = out.pos == out.size && !mIsAtEnd;
    }
    return true;
}

}  // namespace Orvane
