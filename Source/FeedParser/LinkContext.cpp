#include "FeedParser/LinkContext.h"

namespace Orvane::FeedParser {

using Foundation::Ref;
using Foundation::String;
using Foundation::URL;

LinkContext::LinkContext(Tag theTag)
    : PlainTextContext(theTag),
      link(new HTMLLink),
      enclosure(new EnclosureCore),
      isEnclosure(theTag == EnclosureTag) {}

void LinkContext::gotAttribute(const char* prefix, const char* name, const char* value) {
    const Ref<String> whole = String::string(value ? value : "");
    const Ref<String> trimmed = whole->getTrimmedString();
    switch (tagForString(name)) {
        case RelTag:
            link->mRel = trimmed;
            if (tagForString(value) == EnclosureTag) isEnclosure = true;
            break;
        case TypeTag:
            link->mType = trimmed.get();
            enclosure->mMIMEType.setValue(trimmed.get());
            break;
        case TitleTag:
            link->mTitle = trimmed.get();
            enclosure->mTitle.setValue(trimmed.get());
            break;
        case HrefTag:
        case URLTag:
            link->mHref = trimmed.get();
            break;
        case SizeTag:
        case LengthTag:
            enclosure->mLength.setValue(trimmed->toLongLong());
            break;
        default:
            break;
    }
    PlainTextContext::gotAttribute(prefix, name, value);
}

void LinkContext::end() {
    String* content = getText();
    const Ref<URL> base = getBaseURL();
    link->mBaseURL = base.get();
    // The form of RSS: <link>url</link>. An empty element without a URL is one as well.
    if (content && !link->mHref.get()) {
        link->mRel = String::string("alternate");
        link->mHref = content;
    }
    if (!isEnclosure) return;
    const Ref<URL> url = link->getURL();
    if (url.get()) {
        enclosure->mURL.setValue(url.get());
    } else {
        isEnclosure = false;
    }
}

}  // namespace Orvane::FeedParser
