#pragma once

#include "FeedParser/Text/Tidier.h"

namespace Orvane::FeedParser {

/// Makes XHTML, safe to show, of the HTML content of an entry.
class HTMLSnippetTidier : public Tidier {
 public:
    HTMLSnippetTidier() { mTrim = true; }
    bool setupTidyOptions() override;
    const char* getClassName() const override { return "HTMLSnippetTidier"; }

 private:
    int repair(const MarkupEncoding::Text& text, Foundation::URL* baseURL,
               std::string& output) override;
};

}  // namespace Orvane::FeedParser
