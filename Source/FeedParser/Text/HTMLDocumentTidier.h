#pragma once

#include "FeedParser/Text/Tidier.h"

namespace Orvane::FeedParser {

/// Makes XHTML of a web page.
class HTMLDocumentTidier : public Tidier {
 public:
    bool setupTidyOptions() override;
    const char* getClassName() const override { return "HTMLDocumentTidier"; }
};

}  // namespace Orvane::FeedParser
