#include "FeedParser/Context.h"

#include "Foundation/String.h"

namespace Orvane::FeedParser {

using Foundation::Ref;
using Foundation::String;
using Foundation::URL;

bool Context::handleFinishedChild(Context*) {
    return true;
}

void Context::gotAttribute(const char*, const char*, const char*) {}

Foundation::URLReturner Context::getBaseURL() const {
    if (!baseURI) return nullptr;
    const Ref<String> text = String::string(baseURI);
    return URL::lenientURL(text.get(), nullptr);
}

}  // namespace Orvane::FeedParser
