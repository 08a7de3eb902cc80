#include "FeedParser/ContentContext.h"

#include "FeedParser/Text/ParserUtils.h"

#include <cstdlib>
#include <memory>

namespace Orvane::FeedParser {

using Foundation::Data;
using Foundation::MIMEType;
using Foundation::Ref;
using Foundation::URL;

void ContentContext::gotAttribute(const char* prefix, const char* name, const char* value) {
    if (tagForString(name) == ModeTag) {
        const Tag answer = tagForString(value);
        if (answer == Base64Tag) mode = Base64;
        if (answer == EscapedTag) mode = Escaped;
    }
    TextContext::gotAttribute(prefix, name, value);
}

void ContentContext::end() {
    if (!raw) return;
    switch (contentType) {
        case Text:
            decodeEntities(*raw);
            if (mode == Escaped) decodeEntities(*raw);
            store(MIMEType::textPlain(), false);
            break;
        case HTML:
            decodeEntities(*raw);
            store(MIMEType::textHTML(), true);
            break;
        case XHTML:
            store(MIMEType::applicationXHTML(), true);
            break;
        case Other:
            // Whatever the mode says.
            storeBinary();
            break;
    }
}

void ContentContext::store(MIMEType* type, bool isMarkup) {
    const Ref<Data> data = Data::adopt(*std::move(raw));
    raw.reset();
    content->mData.setValue(data.get());
    content->mMIMEType.setValue(type->getString());
    if (!isMarkup) return;
    const Ref<URL> base = getBaseURL();
    content->tidy(base.get());
}

void ContentContext::storeBinary() {
    char* bytes = nullptr;
    std::size_t length = 0;
    ParserUtils::decodeBase64(raw->c_str(), &bytes, &length);
    const std::unique_ptr<char, decltype(&std::free)> owned(bytes, std::free);
    if (length == 0) return;
    const Ref<Data> data = Data::data(bytes, length);
    content->mData.setValue(data.get());
    content->mMIMEType.setValue(typeString.get());
}

}  // namespace Orvane::FeedParser
