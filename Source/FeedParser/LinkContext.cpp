#include "FeedParser/LinkContext.h"

#include <algorithm>
#include <charconv>
#include <limits>
#include <string_view>
#include <system_error>

namespace Orvane::FeedParser {

using Foundation::Ref;
using Foundation::String;
using Foundation::URL;

namespace {

/// The number that the text's first digits make, the largest if 64 bits do not hold it; 0 if the
/// text begins with none.
long long leadingDigits(std::string_view text) {
    const std::size_t count = std::min(text.find_first_not_of("0123456789"), text.size());
    long long number = 0;
    const auto result = std::from_chars(text.data(), text.data() + count, number);
    const bool isTooLarge = result.ec == std::errc::result_out_of_range;
    return isTooLarge ? std::numeric_limits<long long>::max() : number;
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
            enclosure->mLength.setValue(leadingDigits(wanted->view()));
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
