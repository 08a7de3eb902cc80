#include "FeedParser/FeedContext.h"

#include "FeedParser/AuthorContext.h"
#include "FeedParser/ContentContext.h"
#include "FeedParser/DateContext.h"
#include "FeedParser/EntryContext.h"
#include "FeedParser/ImageContext.h"
#include "FeedParser/LinkContext.h"
#include "FeedParser/URLContext.h"
#include "Foundation/Logger.h"

namespace Orvane::FeedParser {

using Foundation::Ref;
using Foundation::URL;

void FeedContext::start() {
    switch (tag) {
        case RSSTag:
        case RDFTag:
            setFormat(Info::RSSFormat);
            break;
        case FeedTag:
            setFormat(Info::AtomFormat);
            break;
        default:
            Foundation::gWarn.log("FeedContext: Unrecognized tag type '%s'", tagName(tag));
            break;
    }
}

void FeedContext::setFormat(Info::Format format) {
    feed->mFeedFormat.setValue(format);
    info->format = format;
}

bool FeedContext::handleFinishedChild(Context* child) {
    switch (child->tag) {
        case AuthorTag:
        case CreatorTag:
            info->addDefaultAuthor(static_cast<AuthorContext*>(child)->author.get());
            return true;
        case ContributorTag:
            info->addDefaultContributor(static_cast<AuthorContext*>(child)->author.get());
            return true;
        case EntryTag:
        case ItemTag:
            feed->addToEntries(static_cast<EntryContext*>(child)->entry.get());
            return true;
        case DescriptionTag:
            description = static_cast<ContentContext*>(child)->content;
            return true;
        case LinkTag:
            takeLink(child);
            return true;
        default:
            return takeText(child) || takeURL(child) || takeDate(child);
    }
}

bool FeedContext::takeText(Context* child) {
    const auto text = [&] { return static_cast<TextContext*>(child)->getText(); };
    switch (child->tag) {
        case SubtitleTag:
        // These two have no text: they empty the column.
        case ContentTag:
        case EncodedTag:
            feed->mSubtitle.setValue(text());
            description = nullptr;
            return true;
        case IDTag:
            feed->mID.setValue(text());
            return true;
        case RightsTag:
            feed->mRights.setValue(text());
            return true;
        case TitleTag:
            feed->mTitle.setValue(text());
            return true;
        default:
            return false;
    }
}

bool FeedContext::takeURL(Context* child) {
    if (child->tag == ImageTag) {
        feed->mLogoURL.setValue(static_cast<ImageContext*>(child)->url.get());
        return true;
    }
    if (child->tag != IconTag && child->tag != LogoTag) return false;
    const Ref<URL> url = static_cast<URLContext*>(child)->getURL();
    (child->tag == IconTag ? feed->mIconURL : feed->mLogoURL).setValue(url.get());
    return true;
}

bool FeedContext::takeDate(Context* child) {
    const auto dateOf = [](Context* context) { return static_cast<DateContext*>(context); };
    switch (child->tag) {
        case UpdatedTag:
        case ModifiedTag:
        case LastBuildDateTag:
            feed->mDateUpdated.setValue(dateOf(child)->date.get());
            feed->mTimeZoneUpdated.setValue(dateOf(child)->timeZone.get());
            return true;
        case PubDateTag:
        case PublishedTag:
            // That is no column of the feed, but what its entries have unless they say otherwise.
            info->defaultTimePublished = dateOf(child)->date;
            info->defaultTimeZonePublished = dateOf(child)->timeZone;
            return true;
        default:
            return false;
    }
}

void FeedContext::takeLink(Context* child) {
    HTMLLink* link = static_cast<LinkContext*>(child)->link.get();
    if (!feed->mAlternateURL.getValue() && link->isAlternate()) {
        const Ref<URL> url = link->getURL();
        feed->mAlternateURL.setValue(url.get());
    }
    info->addLink(link);
}

void FeedContext::end() {
    if (feed->mURL.getValue()) return;
    const Ref<URL> base = getBaseURL();
    feed->mURL.setValue(base.get());
}

}  // namespace Orvane::FeedParser
