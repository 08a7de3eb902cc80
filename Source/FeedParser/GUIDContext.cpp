#include "FeedParser/GUIDContext.h"

namespace Orvane::FeedParser {

void GUIDContext::gotAttribute(const char* prefix, const char* name, const char* value) {
    if (tagForString(name) == IsPermaLinkTag) {
        const Tag answer = tagForString(value);
        if (answer == FalseTag || answer == NoTag) isPermaLink = false;
    }
    URLContext::gotAttribute(prefix, name, value);
}

}  // namespace Orvane::FeedParser
