#pragma once

#include "Net/BodyDecoder.h"

#include <memory>
#include <string>

struct z_stream_s;

namespace Orvane {

/// The codings "gzip" (RFC 1952, one member or several) and "deflate" (RFC 1950; many servers leave
/// the head away and send RFC 1951).
class ZlibDecoder : public BodyDecoder {
 public:
    enum class Form { Gzip, Deflate };

    explicit ZlibDecoder(Form form);
    ~ZlibDecoder() override;

    bool decode(std::string_view input, const Sink& sink) override;
    bool finish() const override { return mState != State::Running; }

 private:
    enum class State {
        Empty,
        Running,
        Complete,  ///< at the end of a stream
        Trailing,  ///< behind it, in what begins no other
    };

    void open(std::string_view start);
    bool decodeStream(std::string_view& input, const Sink& sink);
    bool beginsMember(std::string_view& input);

    const Form mForm;
    std::unique_ptr<z_stream_s> mStream;
    bool mIsOpen = false;
    State mState = State::Empty;
    std::string mStart;  ///< the first bytes of a stream, until there are enough to tell its form
};

}  // namespace Orvane
