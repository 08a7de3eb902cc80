#include "FeedParser/Text/HTMLSnippetTidier.h"

#include "FeedParser/Text/SafeMarkup.h"
#include "FeedParser/Text/TidyDocument.h"

namespace Orvane::FeedParser {

bool HTMLSnippetTidier::setupTidyOptions() {
    return Tidier::setupTidyOptions() && mDoc->set("input-xml", "no") &&
           mDoc->set("output-xhtml", "yes") && mDoc->set("show-body-only", "yes");
}

int HTMLSnippetTidier::repair(const MarkupEncoding::Text& text, Foundation::URL* baseURL,
                              std::string& output) {
    if (!text.isUTF8) {
        // Nobody can tell what is safe in bytes of no known encoding.
        return repair(MarkupEncoding::toUTF8(text.bytes, MarkupEncoding::kLatin1), baseURL, output);
    }
    const int code = repairHTML(text, HTMLMending::Kind::Snippet, output);
    output = SafeMarkup::make(output, baseURL);
    return code;
}

}  // namespace Orvane::FeedParser
