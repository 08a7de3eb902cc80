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
    if (!text.isUTF8) {
        // Nobody can tell what is safe in bytes of no known encoding.
        return repair(MarkupEncoding::toUTF8(text.bytes, MarkupEncoding::kLatin1), baseURL, output);
    }
    const int code = repairXML(text, XMLMending::Kind::Snippet, output);
    output = SafeMarkup::make(output, baseURL);
    return code;
}

}  // namespace Orvane::FeedParser
