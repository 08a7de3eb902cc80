#include "FeedParser/Context.h"

namespace Orvane::FeedParser {

bool Context::handleFinishedChild(Context*) {
    return true;
}

void Context::gotAttribute(const char*, const char*, const char*) {}

Foundation::URLReturner Context::getBaseURL() const {
    return info->getBaseURL(baseURI);
}

}  // namespace Orvane::FeedParser
