#include "FeedParser/DifferenceEngine.h"
#include "FeedParser/Parser.h"
#include "Foundation/Logger.h"
#include "Foundation/LongWork.h"
#include "Model/ParseMark.h"
#include "Net/MemoryReturn.h"
#include "Net/PollingFeeder.h"
#include "SQLite/Database.h"
#include "SQLite/Table.h"

#include <utility>

// What a feeder does with a document.

namespace Orvane {

using FeedParser::Info;
using Foundation::AutoreleasePool;
using Foundation::Data;
using Foundation::gWarn;
using Foundation::LongWork;
using Foundation::NetError;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;

namespace {

constexpr NetError kInternalError(NetError::kOrvane, OVInternalError);

}  // namespace

void PollingFeeder::refreshFromData(Data* data) {
    const Ref<PollingFeeder> alive(this);
    NetError error;
    parseFeed(data, error);
    if (mFeed) mFeed->setLastError(error);
}

void PollingFeeder::parseFeed() {
    if (!mIsParseDue) return;
    mIsParseDue = false;
    // The feeder stays with its feed, and would keep the document as long.
    const Ref<Data> data = std::exchange(mData, nullptr);
    if (data.get()) MemoryReturn::soon(data->getLength());
    NetError error;
    const bool changed = parseFeed(data, error);
    if (error.code != 0) {
        endedRefresh(error);
    } else {
        endedRefresh(changed);
    }
}

bool PollingFeeder::parseFeed(Data* data, NetError& error) {
    if (!mFeed) return false;
    const Ref<FeedCore> feed(mFeed);
    const FeedCore::ReadState before = mBefore ? *mBefore : feed->getReadState();
    mBefore.reset();
    // Who sends nothing sends a document of no bytes.
    const Ref<Data> bytes = data ? Ref<Data>(data) : Ref<Data>(Data::adopt({}));
    bool changed = false;
    try {
        changed = isNew(bytes) && parseAndMerge(bytes, error);
    } catch (...) {
        Foundation::warnAboutCurrentException(
            "bool Orvane::PollingFeeder::parseFeed(Data *, NetError &)");
        error = kInternalError;
    }
    if (error == kInternalError) feed->setReadState(before);
    return error.code == 0 && changed;
}

/// Keeps the document, unless it is the one of the last time.
bool PollingFeeder::isNew(Data* data) {
    const Ref<String> hash = data->SHA1HashString();
    if (!mForce && IsEqual(hash.get(), mFeed->mRefreshDataHash.getValue())) {
        gLogFeed.log("No change in contents of %@", mFeed);
        gLogFeed.log("Finished parsing %@", mFeed);
        return false;
    }
    mFeed->mRefreshDataHash.setValue(hash);
    mFeed->setXMLData(data);
    const SQLite::Table* table = mFeed->getTable();
    if (table && table->getDatabase()) table->getDatabase()->saveRowsSoon();
    return true;
}

bool PollingFeeder::parseAndMerge(Data* data, NetError& error) {
    const AutoreleasePool pool;
    gLogFeed.log("Parsing %@", mFeed);
    const Ref<Foundation::URL> file = mFeed->getURLOfXMLFile();
    const ParseMark mark(file);
    if (mark.isBlocked()) {
        gWarn.log("Not parsing <%@>: it has brought the process down", mURL);
        error = kInternalError;
        return false;
    }
    // The merge tells others of what it does, and they may remove the feed.
    const Ref<FeedCore> feed(mFeed);
    const Ref<FeedCore> parsed = parse(data);
    if (!parsed.get()) error = NetError(NetError::kOrvane, OVNotAFeedError);
    const bool changed = parsed.get() && merge(parsed);
    gLogFeed.log("Finished parsing %@", feed);
    return changed;
}

/// The feed that a document is, or null; keeps its links.
Returner<FeedCore> PollingFeeder::parse(Data* data) {
    const LongWork work("parsing", mURL);
    const FeedParser::Parser parser(data, mFinalURL.get() ? mFinalURL : mURL);
    const Info* info = parser.getInfo();
    if (const HTMLPage* page = info->getPage()) mLinks = page->getLinks();
    if (info->getFeed()) mLinks = info->links.get();
    return Returner<FeedCore>::retained(info->getFeed());
}

bool PollingFeeder::merge(FeedCore* parsed) {
    const LongWork work("merging", mURL);
    parsed->mURL.setValue(mURL);
    parsed->mRedirectedURL.setValue(mFinalPermanentURL);
    return DifferenceEngine(mFeed, mForce).updateFrom(parsed);
}

}  // namespace Orvane
