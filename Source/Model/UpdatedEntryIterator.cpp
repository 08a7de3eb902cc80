#include "Model/UpdatedEntryIterator.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Clock.h"
#include "Foundation/Logger.h"
#include "SQLite/QueryOf.h"

namespace Orvane {

using Foundation::AutoreleasePool;
using SQLite::QueryOf;
using SQLite::TableOf;

namespace {

/// The lower bound leaves out what had already expired at the last look, so that an expiry is told
/// once.
QueryOf<EntryCore>* makeQuery(const char* dateOfContent) {
    return new QueryOf<EntryCore>(
        TableOf<EntryCore>::instance(),
        "select rowID,feed,identifier,"
        "       localDateUpdated,localDateXmlChanged,"
        "        localDateFlagsUpdated,localDateCreated,"
        "        sub.subID as subscription,"
        "        (%s>$SINCE) as hasUpdatedContent,"
        "        (localDateFlagsUpdated>$SINCE) as hasUpdatedFlags,"
        "        (localDateCreated < $NOW-sub.expInt) as hasExpired"
        "   from (select feed as subFeed,"
        "        rowID as subID,"
        "        ifnull(nullif(expirationInterval,0),$DEFAULTEXPINT) as expInt"
        "   from Subscriptions  where client=$CLIENT and feed!=0) as sub, Entries"
        "  where (feed=sub.subFeed)"
        "        and (localDateCreated >= $SINCE-sub.expInt)"
        "       and (hasUpdatedContent or hasUpdatedFlags or hasExpired)",
        dateOfContent);
}

QueryOf<EntryCore>& queryFor(bool usesXML) {
    static QueryOf<EntryCore>* const sByXML = makeQuery("localDateXmlChanged");
    static QueryOf<EntryCore>* const sByContent = makeQuery("localDateUpdated");
    return usesXML ? *sByXML : *sByContent;
}

}  // namespace

UpdatedEntryIterator::UpdatedEntryIterator(ClientCore* client, Date* since)
    : mClient(client), mMaxDate(since), mUsesXML(client->mUsesXML) {
    const AutoreleasePool pool;
    const double from = Date::getAbsoluteTime(since);
    const double now = Foundation::Clock::current().now();
    const double expiration = client->getDefaultSubscription()->mExpirationInterval;
    QueryOf<EntryCore>& query = queryFor(mUsesXML);
    gLogSub.log(
        "UpdatedEntryIterator: =====Beginning (since=%.3lf/%@, now=%.3lf, "
        "usesXML=%i)",
        from, since, now, mUsesXML);
    query.parameterNamed("$CLIENT") = client;
    query.parameterNamed("$DEFAULTEXPINT") = expiration;
    query.parameterNamed("$SINCE") = from;
    query.parameterNamed("$NOW") = now;
    mCursor = std::make_unique<SQLite::CursorOf<EntryCore>>(query);
    _fetchEntry();
}

UpdatedEntryIterator::~UpdatedEntryIterator() {
    gLogSub.log("UpdatedEntryIterator: =====Ended");
}

UpdatedEntryIterator& UpdatedEntryIterator::operator++() {
    const AutoreleasePool pool;
    mCursor->nextRow();
    _fetchEntry();
    return *this;
}

void UpdatedEntryIterator::_fetchEntry() {
    if (!mCursor->hasRow()) {
        mEntry = nullptr;
        mSubscription = nullptr;
        return;
    }
    mEntry = mCursor->row();
    const SQLite::RowID subscription = mCursor->int64Column("subscription");
    mSubscription = TableOf<SubscriptionCore>::instance()->rowWithID(subscription);
    mHasExpired = mCursor->int64Column("hasExpired") != 0;
    mHasUpdatedContent = mCursor->int64Column("hasUpdatedContent") != 0;
    mHasUpdatedFlags = mCursor->int64Column("hasUpdatedFlags") != 0;
    gLogSub.log("    Got %@ (feed=%lli, sub=%#lld)", mEntry, mEntry->mFeed.getRowID(),
                subscription);
    gLogSub.log("        content=%i, flags=%i, expired=%i", mHasUpdatedContent, mHasUpdatedFlags,
                mHasExpired);
    noteDate(mEntry->mLocalDateUpdated);
    noteDate(mEntry->mLocalDateFlagsUpdated);
    if (mUsesXML) noteDate(mEntry->mLocalDateXMLChanged);
    gLogSub.log("    xml=%@, content=%@, flags=%@ (maxDate=%@)",
                mEntry->mLocalDateXMLChanged.getValue(), mEntry->mLocalDateUpdated.getValue(),
                mEntry->mLocalDateFlagsUpdated.getValue(), mMaxDate);
}

void UpdatedEntryIterator::noteDate(Date* date) {
    if (!date || (mMaxDate.get() && mMaxDate->compare(*date) >= 0)) return;
    mMaxDate = date;
}

}  // namespace Orvane
