#include "FeedParser/HomepageContext.h"

namespace Orvane::FeedParser {

void HomepageContext::gotAttribute(const char*, const char* name, const char* value) {
    if (tagForString(name) == ResourceTag && value) raw = value;
}

}  // namespace Orvane::FeedParser
