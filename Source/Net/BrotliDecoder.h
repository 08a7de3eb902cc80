#pragma once

#include "Net/BodyDecoder.h"

#include <memory>

struct BrotliDecoderStateStruct;

namespace Orvane {

/// The coding "br", RFC 7932.
class BrotliDecoder : public BodyDecoder {
 public:
    BrotliDecoder();
    ~BrotliDecoder() override;

    bool decode(std::string_view input, const Sink& sink) override;
    bool finish() const override { return mIsEmpty || mIsComplete; }

 private:
    struct StateDeleter {
        void operator()(BrotliDecoderStateStruct* state) const;
    };

    std::unique_ptr<BrotliDecoderStateStruct, StateDeleter> mState;
    bool mIsEmpty = true;
    bool mIsComplete = false;
};

}  // namespace Orvane
