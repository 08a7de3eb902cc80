#pragma once

#include "Net/BodyDecoder.h"

#include <memory>

struct ZSTD_DCtx_s;

namespace Orvane {

/// The coding "zstd", RFC 8878, one frame or several. A frame whose window is larger than RFC 9659
/// lets it be is refused.
class ZstdDecoder : public BodyDecoder {
 public:
    ZstdDecoder();
    ~ZstdDecoder() override;

    bool decode(std::string_view input, const Sink& sink) override;
    bool finish() const override { return mIsAtEnd; }

 private:
    struct ContextDeleter {
        void operator()(ZSTD_DCtx_s* context) const;
    };

    std::unique_ptr<ZSTD_DCtx_s, ContextDeleter> mContext;
    bool mIsAtEnd = true;  ///< of a frame, or before the first one
};

}  // namespace Orvane
