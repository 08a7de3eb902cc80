#pragma once

#include "Foundation/Uncopyable.h"

#include <functional>
#include <memory>
#include <string_view>

namespace Orvane {

/// Undoes one content coding, RFC 9110, 8.4.1, block by block. What it has been given so far may be
/// taken for good only once `finish` has been true.
class BodyDecoder : Foundation::Uncopyable {
 public:
    /// Takes a block of what comes out; false stops the decoding, which then has failed.
    using Sink = std::function<bool(std::string_view block)>;

    /// Those that a decoder is there for, as a request asks for them.
    static constexpr const char* kAcceptedCodings = "gzip, deflate, br, zstd";
    /// The most that is handed to the sink at a time.
    static constexpr std::size_t kBlockBytes = std::size_t{64} << 10;

    /// The decoder of a coding by its name, in any case; null for one that is not known.
    static std::unique_ptr<BodyDecoder> forCoding(std::string_view name);

    virtual ~BodyDecoder() = default;

    /// False if the input is corrupt, or the sink wants no more. What follows a complete stream and
    /// does not begin another is left out of account.
    [[nodiscard]] virtual bool decode(std::string_view input, const Sink& sink) = 0;
    /// Whether what was given is complete: the end of a stream, or nothing at all.
    [[nodiscard]] virtual bool finish() const = 0;
};

}  // namespace Orvane
