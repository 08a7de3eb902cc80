#include "Net/BodyDecoder.h"

#include "Net/BrotliDecoder.h"
#include "Net/HTTPMessage.h"
#include "Net/ZlibDecoder.h"
#include "Net/ZstdDecoder.h"

namespace Orvane {

std::unique_ptr<BodyDecoder> BodyDecoder::forCoding(std::string_view name) {
    const auto is = [name](std::string_view other) { return HTTPMessage::isSameName(name, other); };
    if (is("gzip") || is("x-gzip")) return std::make_unique<ZlibDecoder>(ZlibDecoder::Form::Gzip);
    if (is("deflate")) return std::make_unique<ZlibDecoder>(ZlibDecoder::Form::Deflate);
    if (is("br")) return std::make_unique<BrotliDecoder>();
    if (is("zstd")) return std::make_unique<ZstdDecoder>();
    return nullptr;
}

}  // namespace Orvane
