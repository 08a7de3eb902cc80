#include "FeedParser/Text/HTMLSnippetTidier.h"

#include "FeedParser/Text/TidyDocument.h"

namespace Orvane::FeedParser {

bool HTMLSnippetTidier::setupTidyOptions() {
    return Tidier::setupTidyOptions() && mDoc->set("input-xml", "no") &&
           mDoc->set("output-xhtml", "yes") && mDoc->set("show-body-only", "yes");
}

}  // namespace Orvane::FeedParser
