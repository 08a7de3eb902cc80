#pragma once

#include "FeedParser/Text/Tidier.h"

namespace Orvane::FeedParser {

/// Makes XHTML of a web page.
class HTMLDocumentTidier : public Tidier {
 public:
    bool setupTidyOptions() override;
    const char* getClassName() const override { return "HTMLDocumentTidier"; }

 private:
    int repair(const MarkupEncoding::Text& text, Foundation::URL* baseURL,
               std::string& output) override;
};

}  // namespace Orvane::FeedParser
