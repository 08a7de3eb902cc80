#include "FeedParser/Text/XMLSnippetTidier.h"

#include "FeedParser/Text/TidyDocument.h"

namespace Orvane::FeedParser {

bool XMLSnippetTidier::setupTidyOptions() {
    return Tidier::setupTidyOptions() && mDoc->set("input-xml", "yes") &&
           mDoc->set("output-xhtml", "yes") && mDoc->set("show-body-only", "yes");
}

}  // namespace Orvane::FeedParser
