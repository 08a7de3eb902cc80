#include "FeedParser/Text/FeedTidier.h"

#include "FeedParser/Text/TidyDocument.h"

namespace Orvane::FeedParser {

bool FeedTidier::setupTidyOptions() {
    return Tidier::setupTidyOptions() && mDoc->set("input-xml", "yes") &&
           mDoc->set("output-xml", "yes");
}

}  // namespace Orvane::FeedParser
