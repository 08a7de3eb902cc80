#include "FeedParser/AuthorContext.h"

#include "FeedParser/Text/RSSAuthorParser.h"
#include "FeedParser/URLContext.h"

namespace Orvane::FeedParser {

using Foundation::Ref;
using Foundation::String;
using Foundation::URL;

bool AuthorContext::handleFinishedChild(Context* child) {
    sawChild = true;
    switch (child->tag) {
        case EmailTag:
            author->mEmail.setValue(static_cast<TextContext*>(child)->getText());
            return true;
        case NameTag:
            author->mName.setValue(static_cast<TextContext*>(child)->getText());
            return true;
        case URITag: {
            const Ref<URL> url = static_cast<URLContext*>(child)->getURL();
            author->mURL.setValue(url.get());
            return true;
        }
        default:
            return false;
    }
}

void AuthorContext::end() {
    if (sawChild || !raw) return;
    decodeEntities(*raw);
    text = String::string(*std::move(raw));
    raw.reset();
    const RSSAuthorParser parser(text.get());
    author->mName.setValue(parser.name.get());
    author->mEmail.setValue(parser.email.get());
}

}  // namespace Orvane::FeedParser
