#include "FeedParser/AuthorContext.h"
#include "FeedParser/BaseContext.h"
#include "FeedParser/ContentContext.h"
#include "FeedParser/DateContext.h"
#include "FeedParser/EntryContext.h"
#include "FeedParser/FriendContext.h"
#include "FeedParser/GUIDContext.h"
#include "FeedParser/HeadContext.h"
#include "FeedParser/HomepageContext.h"
#include "FeedParser/ImageContext.h"
#include "FeedParser/KnowsContext.h"
#include "FeedParser/LinkContext.h"
#include "FeedParser/NamespaceClass.h"
#include "FeedParser/PageContext.h"
#include "FeedParser/RDFContext.h"
#include "FeedParser/RootContext.h"
#include "FeedParser/UnknownContext.h"
#include "Foundation/Logger.h"

namespace Orvane::FeedParser {

namespace {

// What each vocabulary has, as new contexts; null for what it has not.

Context* makeForHTML(Tag name) {
    switch (name) {
        case BaseTag:
            return new BaseContext(name);
        case HeadTag:
            return new HeadContext(name);
        case HTMLTag:
            return new PageContext(name);
        case LinkTag:
            return new LinkContext(name);
        default:
            return nullptr;
    }
}

Context* makeTextForFeed(Tag name) {
    switch (name) {
        case ContentTag:
        case DescriptionTag:
        case SummaryTag:
            return new ContentContext(name);
        case EmailTag:
        case IDTag:
        case NameTag:
        case RightsTag:
        case SubtitleTag:
        case TitleTag:
        case VersionTag:
            return new PlainTextContext(name);
        case IssuedTag:
        case LastBuildDateTag:
        case ModifiedTag:
        case PubDateTag:
        case PublishedTag:
        case UpdatedTag:
            return new DateContext(name);
        default:
            return nullptr;
    }
}

Context* makeLinkForFeed(Tag name) {
    switch (name) {
        case BaseTag:
            return new BaseContext(name);
        case EnclosureTag:
        case LinkTag:
            return new LinkContext(name);
        case GUIDTag:
            return new GUIDContext(name);
        case IconTag:
        case LogoTag:
        case URITag:
        case URLTag:
            return new URLContext(name);
        default:
            return nullptr;
    }
}

Context* makeForFeed(Tag name) {
    switch (name) {
        case AuthorTag:
        case ContributorTag:
            return new AuthorContext(name);
        case ChannelTag:
            return new PassThruContext(name);
        case EntryTag:
        case ItemTag:
            return new EntryContext(name);
        case FeedTag:
        case RSSTag:
            return new FeedContext(name);
        case ImageTag:
            return new ImageContext(name);
        default: {
            Context* text = makeTextForFeed(name);
            return text ? text : makeLinkForFeed(name);
        }
    }
}

Context* makeForDublinCore(Tag name) {
    switch (name) {
        case CreatorTag:
        case ContributorTag:
            return new AuthorContext(name);
        case CreatedTag:
        case DateTag:
            return new DateContext(name);
        case DescriptionTag:
            return new ContentContext(name);
        case RightsTag:
        case TitleTag:
            return new PlainTextContext(name);
        default:
            return nullptr;
    }
}

Context* makeForRDF(Tag name) {
    return name == RDFTag ? new RDFContext(name) : nullptr;
}

Context* makeForContentModule(Tag name) {
    return name == EncodedTag ? new ContentContext(name) : nullptr;
}

Context* makeForFOAF(Tag name) {
    switch (name) {
        case FamilyNameTag:
        case FirstNameTag:
        case GivenNameTag:
        case NameTag:
        case NickTag:
        case SurNameTag:
            return new PlainTextContext(name);
        case HomepageTag:
        case WeblogTag:
            return new HomepageContext(name);
        case KnowsTag:
            return new KnowsContext(name);
        case PersonTag:
            return new FriendContext(name);
        default:
            return nullptr;
    }
}

/// Asks the vocabularies that the element may belong to, of which the first that has the name
/// counts. Null if none has.
Context* makeChild(NamespaceClass uri, Tag prefix, Tag name, bool lenient) {
    const bool isBare = uri == BlankUri && prefix == BlankTag;
    Context* made = nullptr;
    const auto ask = [&](bool mayBelong, Context* (*make)(Tag)) {
        if (!made && mayBelong) made = make(name);
    };
    ask(uri == HTMLUri || isBare, makeForHTML);
    ask(uri == FeedUri || isBare, makeForFeed);
    ask(uri == DublinCoreUri || prefix == DCTag || lenient, makeForDublinCore);
    ask(uri == RDFUri || prefix == RDFTag || lenient, makeForRDF);
    ask(uri == ContentUri || prefix == ContentTag || lenient, makeForContentModule);
    ask(uri == FOAFUri || prefix == FOAFTag || lenient, makeForFOAF);
    return made;
}

const char* orNull(const char* text) {
    return text ? text : "(null)";
}

}  // namespace

using Foundation::Returner;

Returner<Context> Context::newRootContext() {
    return Returner<Context>::adopted(new RootContext);
}

Returner<Context> Context::newChild(const char* uri, const char* prefix, const char* localName,
                                    bool lenient) {
    const NamespaceClass uriClass = sStringToUri(uri);
    const Tag prefixTag = tagForString(prefix);
    const Tag nameTag = tagForString(localName);
    gLogParserVerbose.log("Context::newChild('%s' - %s, '%s' - %s, '%s' - %s, %d)", orNull(uri),
                          namespaceClassName(uriClass), orNull(prefix), tagName(prefixTag),
                          orNull(localName), tagName(nameTag), lenient);
    Context* child = makeChild(uriClass, prefixTag, nameTag, lenient);
    return Returner<Context>::adopted(child ? child : new UnknownContext(nameTag));
}

}  // namespace Orvane::FeedParser
