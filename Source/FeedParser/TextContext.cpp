#include "FeedParser/TextContext.h"

#include "FeedParser/Text/ParserUtils.h"

namespace Orvane::FeedParser {

using Foundation::Ref;
using Foundation::String;

void TextContext::start() {
    if (info->format == Info::RSSFormat) contentType = HTML;
}

void TextContext::gotAttribute(const char*, const char* name, const char* value) {
    if (tagForString(name) == TypeTag) setType(value);
}

void TextContext::setType(const char* value) {
    switch (tagForString(value)) {
        case TextTag:
        case TextPlainTag:
            contentType = Text;
            break;
        case HTMLTag:
        case TextHTMLTag:
            contentType = HTML;
            break;
        case TextXHTMLXMLTag:
        case TextXHTMLTag:
        case XHTMLTag:
        case ApplicationXHTMLXMLTag:
            contentType = XHTML;
            break;
        default:
            contentType = Other;
            typeString = trimmed(value);
            break;
    }
}

Foundation::StringReturner TextContext::trimmed(const char* value) {
    const Ref<String> whole = String::string(value ? value : "");
    return whole.get() ? whole->getTrimmedString() : nullptr;
}

void TextContext::decodeEntities(std::string& text) {
    text.resize(ParserUtils::decodeEntities(text.data(), text.data(), true));
}

}  // namespace Orvane::FeedParser
