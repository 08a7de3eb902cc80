#pragma once

#include "FeedParser/Friend.h"
#include "FeedParser/Text/HTMLLink.h"
#include "FeedParser/Text/HTMLPage.h"
#include "Foundation/ArrayOf.h"
#include "Foundation/Date.h"
#include "Foundation/Ref.h"
#include "Foundation/RefCounted.h"
#include "Foundation/TimeZone.h"
#include "Foundation/URL.h"
#include "Model/AuthorCore.h"
#include "Model/ContentCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"

#include <cstdint>

namespace Orvane::FeedParser {

class Parser;

/// What a document turned out to be, and what contexts share while it is read.
class Info : public Foundation::RefCounted {
 public:
    enum Kind : std::int32_t {
        UnknownKind = 0,
        PageKind = 1,
        FeedKind = 2,
        EntryKind = 3,
        FriendKind = 4,
    };
    /// The numbers of the column `feedFormat`.
    enum Format : std::int32_t { UnknownFormat = 0, RSSFormat = 1, AtomFormat = 2 };

    /// `url` is the document's and may be null.
    Info(Parser* theParser, Foundation::URL* theURL);

    // What the document holds, null unless `kind` says so. Owned by this.

    HTMLPage* getPage() const { return kind == PageKind ? page.get() : nullptr; }
    FeedCore* getFeed() const { return kind == FeedKind ? feed.get() : nullptr; }
    EntryCore* getEntry() const { return kind == EntryKind ? entry.get() : nullptr; }
    Friend* getFriend() const { return kind == FriendKind ? friend_.get() : nullptr; }

    /// Adds an author of all entries that name none; an empty one is ignored.
    void addDefaultAuthor(AuthorCore* author);
    void addDefaultContributor(AuthorCore* author);
    /// Adds a link of the feed, of whatever kind.
    void addLink(HTMLLink* link);
    /// A hundredth of a second before what it gave last, or before the time at which this was made:
    /// so entries keep the document's order, in which the first is the newest.
    Foundation::DateReturner getNextEntryCreationDate();
    /// The URL of a text that contexts have for their base, which must live as long as the parse;
    /// null for null, and if it is none or too long. Most ask for the same one after the other.
    Foundation::URLReturner getBaseURL(const char* text);

    Parser* parser;  ///< not owned
    Foundation::Ref<Foundation::URL> url;
    // The feed's date, for entries without one.
    Foundation::Ref<Foundation::Date> defaultTimePublished;
    Foundation::Ref<Foundation::TimeZone> defaultTimeZonePublished;
    Kind kind = UnknownKind;
    Format format = UnknownFormat;
    Foundation::Ref<HTMLPage> page;
    Foundation::Ref<FeedCore> feed;
    Foundation::Ref<ContentCore> description;  ///< what the feed's subtitle is to be made of
    Foundation::Ref<EntryCore> entry;
    Foundation::Ref<Friend> friend_;
    // Null while there are none.
    Foundation::Ref<Foundation::MutableArrayOf<AuthorCore>> defaultAuthors;
    Foundation::Ref<Foundation::MutableArrayOf<AuthorCore>> defaultContributors;
    Foundation::Ref<Foundation::MutableArrayOf<HTMLLink>> links;
    double nextEntryCreationTime;  ///< absolute
    bool done = false;             ///< nothing more is to be read

 private:
    const char* mBaseText = nullptr;  ///< what `mBaseURL` was made of
    Foundation::Ref<Foundation::URL> mBaseURL;
};

}  // namespace Orvane::FeedParser
