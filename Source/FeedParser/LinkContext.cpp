#include "FeedParser/LinkContext.h"

#include "FeedParser/Text/XMLCharacters.h"

namespace Orvane::FeedParser {

using Foundation::Ref;
using Foundation::String;
using Foundation::URL;

namespace {

/// The number at the start of the text, which has no sign; 0 if there is none.
long long leadingDigits(const String& text) {
    const bool isDigit = !text.utf8().empty() && XMLCharacters::isDigit(text.utf8().front());
    return isDigit ? text.toLongLong() : 0;
}

}  // namespace

LinkContext::LinkContext(Tag theTag)
    : PlainTextContext(theTag),
      link(new HTMLLink),
      enclosure(new EnclosureCore),
      isEnclosure(theTag == EnclosureTag) {}

void LinkContext::gotAttribute(const char* prefix, const char* name, const char* value) {
    const Ref<String> wanted = trimmed(value);
    if (!wanted.get()) return;
    switch (tagForString(name)) {
        case RelTag:
            link->mRel = wanted.get();
            if (tagForString(value) == EnclosureTag) isEnclosure = true;
            break;
        case TypeTag:
            link->mType = wanted.get();
            enclosure->mMIMEType.setValue(wanted.get());
            break;
        case TitleTag:
            link->mTitle = wanted.get();
            enclosure->mTitle.setValue(wanted.get());
            break;
        case HrefTag:
        case URLTag:
            link->mHref = wanted.get();
            break;
        case SizeTag:
        case LengthTag:
            enclosure->mLength.setValue(leadingDigits(*wanted));
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
