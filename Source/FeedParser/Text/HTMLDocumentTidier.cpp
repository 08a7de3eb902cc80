#include "FeedParser/Text/HTMLDocumentTidier.h"

#include "FeedParser/Text/TidyDocument.h"

namespace Orvane::FeedParser {

bool HTMLDocumentTidier::setupTidyOptions() {
    return Tidier::setupTidyOptions() && mDoc->set("input-xml", "no") &&
           mDoc->set("output-xhtml", "yes") && mDoc->set("show-body-only", "no");
}

}  // namespace Orvane::FeedParser
