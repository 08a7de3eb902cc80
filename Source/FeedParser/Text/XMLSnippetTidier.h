#pragma once

#include "FeedParser/Text/Tidier.h"

namespace Orvane::FeedParser {

/// Makes XHTML, safe to show, of the XML content of an entry.
class XMLSnippetTidier : public Tidier {
 public:
    XMLSnippetTidier() {
        mTrim = true;
        mReadsXML = true;
    }
    bool setupTidyOptions() override;
    const char* getClassName() const override { return "XMLSnippetTidier"; }

 private:
    int repair(const MarkupEncoding::Text& text, Foundation::URL* baseURL,
               std::string& output) override;
};

}  // namespace Orvane::FeedParser
