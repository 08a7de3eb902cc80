#include "FeedParser/PlainTextContext.h"

#include "FeedParser/Text/ParserUtils.h"

namespace Orvane::FeedParser {

using Foundation::String;

String* PlainTextContext::getText() const {
    if (!text.get()) text = makeText();
    return text.get();
}

Foundation::StringReturner PlainTextContext::makeText() const {
    if (!raw) return String::string(std::string());
    std::string plain = *std::move(raw);
    raw.reset();
    decodeEntities(plain);
    // Such a text is escaped once for XML and once more for HTML.
    if (info->format == Info::RSSFormat || contentType == HTML || contentType == XHTML) {
        decodeEntities(plain);
    }
    plain.resize(ParserUtils::convertToPlainText(plain.data(), plain.data()));
    return String::string(std::move(plain));
}

}  // namespace Orvane::FeedParser
