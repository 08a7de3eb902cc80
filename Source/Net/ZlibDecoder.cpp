#include "Net/ZlibDecoder.h"

#include "Foundation/AssertionFailure.h"

#include <zlib.h>

#include <array>
#include <utility>

namespace Orvane {

namespace {

// What inflateInit2 takes for the form of a stream.
constexpr int kGzipWindow = 15 + 16;
constexpr int kZlibWindow = 15;
constexpr int kRawWindow = -15;

constexpr std::size_t kStartBytes = 2;

/// Whether two bytes are the head of RFC 1950: method 8, a small enough window, and a checksum.
bool isZlibHead(std::string_view bytes) {
    const unsigned first = static_cast<unsigned char>(bytes[0]);
    const unsigned second = static_cast<unsigned char>(bytes[1]);
    return (first & 0x0f) == 8 && (first >> 4) <= 7 && (first * 256 + second) % 31 == 0;
}

}  // namespace

ZlibDecoder::ZlibDecoder(Form form) : mForm(form), mStream(std::make_unique<z_stream>()) {}

ZlibDecoder::~ZlibDecoder() {
    if (mIsOpen) inflateEnd(mStream.get());
}

void ZlibDecoder::open(std::string_view start) {
    int window = kGzipWindow;
    if (mForm == Form::Deflate) window = isZlibHead(start) ? kZlibWindow : kRawWindow;
    OV_ASSERT(inflateInit2(mStream.get(), window) == Z_OK);
    mIsOpen = true;
}

bool ZlibDecoder::decode(std::string_view input, const Sink& sink) {
    if (input.empty() || mState == State::Trailing) return true;
    if (mState == State::Empty) mState = State::Running;
    std::string start;
    if (!mIsOpen) {
        mStart += input;
        if (mStart.size() < kStartBytes) return true;
        start = std::exchange(mStart, {});
        input = start;
        open(input);
    }
    while (!input.empty()) {
        if (mState == State::Complete && !beginsMember(input)) return true;
        if (!decodeStream(input, sink)) return false;
    }
    return true;
}

/// Whether a further member follows the last one. Where one byte alone is there, the next tells.
bool ZlibDecoder::beginsMember(std::string_view& input) {
    constexpr char kMagic = '\x1f';
    if (mForm != Form::Gzip || input.front() != kMagic) {
        mState = State::Trailing;
        return false;
    }
    inflateReset(mStream.get());
    mState = State::Running;
    return true;
}

/// Decodes to the end of the input or of the stream, and takes off what it has used.
bool ZlibDecoder::decodeStream(std::string_view& input, const Sink& sink) {
    std::array<char, kBlockBytes> block;
    z_stream& stream = *mStream;
    // The interface takes no constant input and changes none.
    stream.next_in = reinterpret_cast<Bytef*>(const_cast<char*>(input.data()));
    stream.avail_in = static_cast<uInt>(input.size());
    int result = Z_OK;
    do {
        stream.next_out = reinterpret_cast<Bytef*>(block.data());
        stream.avail_out = static_cast<uInt>(block.size());
        result = inflate(&stream, Z_NO_FLUSH);
        if (result != Z_OK && result != Z_STREAM_END && result != Z_BUF_ERROR) return false;
        const std::size_t length = block.size() - stream.avail_out;
        if (length > 0 && !sink({block.data(), length})) return false;
    } while (result == Z_OK && (stream.avail_in > 0 || stream.avail_out == 0));
    input.remove_prefix(input.size() - stream.avail_in);
    if (result == Z_STREAM_END) mState = State::Complete;
    return result == Z_STREAM_END || input.empty();
}

}  // namespace Orvane
