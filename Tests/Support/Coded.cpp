#include "Support/Coded.h"

#include <brotli/encode.h>
#include <gtest/gtest.h>
#include <zlib.h>
#include <zstd.h>

namespace Support {

namespace {

std::string zlibbed(std::string_view text, int window) {
    z_stream stream{};
    EXPECT_EQ(deflateInit2(&stream, 9, Z_DEFLATED, window, 9, Z_DEFAULT_STRATEGY), Z_OK);
    std::string coded(deflateBound(&stream, text.size()), '\0');
    stream.next_in = reinterpret_cast<Bytef*>(const_cast<char*>(text.data()));
    stream.avail_in = static_cast<uInt>(text.size());
    stream.next_out = reinterpret_cast<Bytef*>(coded.data());
    stream.avail_out = static_cast<uInt>(coded.size());
    EXPECT_EQ(deflate(&stream, Z_FINISH), Z_STREAM_END);
    coded.resize(coded.size() - stream.avail_out);
    deflateEnd(&stream);
    return coded;
}

}  // namespace

std::string gzipped(std::string_view text) {
    return zlibbed(text, 15 + 16);
}

std::string deflated(std::string_view text) {
    return zlibbed(text, 15);
}

std::string rawDeflated(std::string_view text) {
    return zlibbed(text, -15);
}

std::string brotlied(std::string_view text) {
    std::size_t size = BrotliEncoderMaxCompressedSize(text.size()) + 16;
    std::string coded(size, '\0');
    EXPECT_TRUE(BrotliEncoderCompress(5, BROTLI_DEFAULT_WINDOW, BROTLI_MODE_TEXT, text.size(),
                                      reinterpret_cast<const std::uint8_t*>(text.data()), &size,
                                      reinterpret_cast<std::uint8_t*>(coded.data())));
    coded.resize(size);
    return coded;
}

std::string zstandarded(std::string_view text) {
    std::string coded(ZSTD_compressBound(text.size()), '\0');
    const std::size_t size = ZSTD_compress(coded.data(), coded.size(), text.data(), text.size(), 3);
    EXPECT_FALSE(ZSTD_isError(size));
    coded.resize(size);
    return coded;
}

}  // namespace Support
