#include "FeedParser/EntryContext.h"

#include "FeedParser/AuthorContext.h"
#include "FeedParser/ContentContext.h"
#include "FeedParser/DateContext.h"
#include "FeedParser/GUIDContext.h"
#include "FeedParser/LinkContext.h"
#include "FeedParser/Text/Bounds.h"

namespace Orvane::FeedParser {

using Foundation::Data;
using Foundation::Date;
using Foundation::Ref;
using Foundation::URL;

void EntryContext::start() {
    if (info->format != Info::UnknownFormat) return;
    info->format = tag == EntryTag ? Info::AtomFormat : Info::RSSFormat;
}

bool EntryContext::handleFinishedChild(Context* child) {
    switch (child->tag) {
        case AuthorTag:
        case CreatorTag:
            entry->addToAuthors(static_cast<AuthorContext*>(child)->author.get());
            return true;
        case ContributorTag:
            entry->addToContributors(static_cast<AuthorContext*>(child)->author.get());
            return true;
        case SummaryTag:
            entry->setSummary(static_cast<ContentContext*>(child)->content.get());
            return true;
        case DescriptionTag:
        case ContentTag:
        case EncodedTag:
            takeContent(child);
            return true;
        case GUIDTag:
            takeGUID(child);
            return true;
        case LinkTag:
        case EnclosureTag:
            takeLink(child);
            return true;
        default:
            return takeText(child) || takeDate(child);
    }
}

bool EntryContext::takeText(Context* child) {
    const auto text = [&] { return static_cast<TextContext*>(child)->getText(); };
    switch (child->tag) {
        case IDTag:
            entry->mID.setValue(text());
            return true;
        case RightsTag:
            entry->mRights.setValue(text());
            return true;
        case TitleTag:
            entry->mTitle.setValue(text());
            return true;
        default:
            return false;
    }
}

bool EntryContext::takeDate(Context* child) {
    const auto set = [&](auto& dateColumn, auto& zoneColumn) {
        const auto* date = static_cast<DateContext*>(child);
        dateColumn.setValue(date->date.get());
        zoneColumn.setValue(date->timeZone.get());
        return true;
    };
    switch (child->tag) {
        case CreatedTag:
            return set(entry->mDateCreated, entry->mTimeZoneCreated);
        case ModifiedTag:
        case UpdatedTag:
            return set(entry->mDateUpdated, entry->mTimeZoneUpdated);
        case DateTag:
        case IssuedTag:
        case PubDateTag:
        case PublishedTag:
            return set(entry->mDatePublished, entry->mTimeZonePublished);
        default:
            return false;
    }
}

void EntryContext::takeContent(Context* child) {
    ContentCore* content = static_cast<ContentContext*>(child)->content.get();
    if (content->isBetterThan(entry->getContent())) entry->setContent(content);
}

void EntryContext::takeGUID(Context* child) {
    const auto* guid = static_cast<GUIDContext*>(child);
    entry->mID.setValue(guid->getText());
    if (!guid->isPermaLink) return;
    const Ref<URL> url = guid->getURL();
    entry->mAlternateURL.setValue(url.get());
}

void EntryContext::takeLink(Context* child) {
    const auto* context = static_cast<LinkContext*>(child);
    if (context->isEnclosure) {
        if (mEnclosures == Bounds::kEnclosures) Bounds::logHit("enclosures", mEnclosures);
        if (mEnclosures++ >= Bounds::kEnclosures) return;
        entry->addToEnclosures(context->enclosure.get());
    } else if (!entry->mAlternateURL.getValue() && context->link->isAlternate()) {
        const Ref<URL> url = context->link->getURL();
        entry->mAlternateURL.setValue(url.get());
    }
}

void EntryContext::end() {
    entry->mCurrent.setValue(true);
    const Ref<URL> base = getBaseURL();
    entry->mBaseURL.setValue(base.get());
    const Ref<Date> created = info->getNextEntryCreationDate();
    entry->mLocalDateCreated.setValue(created.get());
    if (raw) keepXML();
}

void EntryContext::keepXML() {
    const Ref<Data> data = Data::adopt(*std::move(raw));
    raw.reset();
    const Ref<ContentCore> content(new ContentCore);
    content->mData.setValue(data.get());
    entry->setXMLRepresentation(content.get());
}

}  // namespace Orvane::FeedParser
