#include "FeedParser/Text/HTMLDocumentTidier.h"

#include "FeedParser/Text/TidyDocument.h"

namespace Orvane::FeedParser {

bool HTMLDocumentTidier::setupTidyOptions() {
    return Tidier::setupTidyOptions() && mDoc->set("input-xml", "no") &&
           mDoc->set("output-xhtml", "yes") && mDoc->set("show-body-only", "no");
}

int HTMLDocumentTidier::repair(const MarkupEncoding::Text& text, Foundation::URL* /*baseURL*/,
                               std::string& output) {
    return repairHTML(text, HTMLMending::Kind::Page, output);
}

}  // namespace Orvane::FeedParser
