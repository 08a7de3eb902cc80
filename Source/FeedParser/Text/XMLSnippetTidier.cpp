#include "FeedParser/Text/XMLSnippetTidier.h"

#include "FeedParser/Text/SafeMarkup.h"
#include "FeedParser/Text/TidyDocument.h"

namespace Orvane::FeedParser {

bool XMLSnippetTidier::setupTidyOptions() {
    return Tidier::setupTidyOptions() && mDoc->set("input-xml", "yes") &&
           mDoc->set("output-xhtml", "yes") && mDoc->set("show-body-only", "yes");
}

int XMLSnippetTidier::repair(const MarkupEncoding::Text& text, Foundation::URL* baseURL,
                             std::string& output) {
    const int code = repairXML(text, XMLMending::Kind::Snippet, output);
    output = SafeMarkup::make(output, baseURL);
    return code;
}

}  // namespace Orvane::FeedParser
