#pragma once

#include "Foundation/NetError.h"
#include "Net/BodyDecoder.h"
#include "Net/ConnectionLimits.h"

#include <array>
#include <memory>
#include <string>
#include <vector>

namespace Orvane {

class HTTPMessage;

/// Turns a body as it was sent into what it stands for: undoes its codings, and keeps it within its
/// bounds (`ConnectionLimits`). What is wrong with it is an error, code -1011 of domain 15, and in
/// the log.
class BodyReader : Foundation::Uncopyable {
 public:
    /// Takes a block; false if it wants no more.
    using Sink = BodyDecoder::Sink;

    /// Of a response to a request for `url`, which is for the log. A file's body (`isDocument`
    /// false) may be of any size, and stays as it is if it is a part of one.
    BodyReader(std::string url, const HTTPMessage& response, bool isDocument);
    ~BodyReader();

    /// Whether the codings are known. A response that stands for no success may have any until a
    /// block of its body is taken.
    Foundation::NetError open();
    /// Hands what a block stands for to the sink. No error if the sink wants no more.
    Foundation::NetError take(std::string_view block, const Sink& sink);
    /// The body is over: whether it is complete.
    Foundation::NetError finish();

 private:
    std::string findDecoders();
    bool decode(std::size_t step, std::string_view block, const Sink& sink);
    bool count(std::size_t step, std::string_view block);
    Foundation::NetError fail(const std::string& what);

    const std::string mURL;
    const bool mIsDocument;
    const bool mIsSuccess;
    std::vector<std::string> mCodings;  ///< in the order in which they were put on
    std::vector<std::unique_ptr<BodyDecoder>> mDecoders;  ///< in the order in which they come off
    /// What has come to each step: first what was sent, last what it stands for.
    std::array<std::size_t, ConnectionLimits::kMaxContentCodings + 1> mBytes = {};
    std::string mTrouble;  ///< a bound that was hit, or codings that nobody can undo
    bool mIsRefused = false;
};

}  // namespace Orvane
