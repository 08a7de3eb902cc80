#pragma once

#include "FeedParser/Text/Tidier.h"

namespace Orvane::FeedParser {

/// Repairs a feed that is no well-formed XML. Gives null for a page.
class FeedTidier : public Tidier {
 public:
    FeedTidier() { mReadsXML = true; }
    bool setupTidyOptions() override;
    const char* getClassName() const override { return "FeedTidier"; }

 private:
    int repair(const MarkupEncoding::Text& text, Foundation::URL* baseURL,
               std::string& output) override;
};

}  // namespace Orvane::FeedParser
