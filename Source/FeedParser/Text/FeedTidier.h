#pragma once

#include "FeedParser/Text/Tidier.h"

namespace Orvane::FeedParser {

/// Repairs a feed that is no well-formed XML.
class FeedTidier : public Tidier {
 public:
    bool setupTidyOptions() override;
    const char* getClassName() const override { return "FeedTidier"; }
};

}  // namespace Orvane::FeedParser
