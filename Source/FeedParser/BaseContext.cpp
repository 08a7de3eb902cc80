#include "FeedParser/BaseContext.h"

namespace Orvane::FeedParser {

void BaseContext::gotAttribute(const char*, const char* name, const char* value) {
    if (tagForString(name) == HrefTag) text = Foundation::String::string(value);
}

}  // namespace Orvane::FeedParser
