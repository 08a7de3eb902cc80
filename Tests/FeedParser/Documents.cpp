#include "FeedParser/Documents.h"

#include "Foundation/Clock.h"
#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/URL.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"

using namespace Foundation;
using namespace Orvane;

namespace {

template <class T>
T* make() {
    return Returner<T>::adopted(new T);
}

String* string(const std::string& text) {
    return String::string(text);
}

FeedCore* makeFeed(const char* url) {
    auto* feed = make<FeedCore>();
    feed->mURL.setValue(URL::url(string(url)));
    return feed;
}

ContentCore* makeContent(const char* type, const std::string& text) {
    auto* content = make<ContentCore>();
    content->mData.setValue(Data::adopt(text));
    content->mMIMEType.setValue(string(type));
    return content;
}

EnclosureCore* makeEnclosure(long long length) {
    auto* enclosure = make<EnclosureCore>();
    enclosure->mURL.setValue(URL::url(string("http://example.org/file.mp3")));
    enclosure->mLength.setValue(length);
    return enclosure;
}

EntryCore* makeEntry(const Post& post, double created) {
    auto* entry = make<EntryCore>();
    entry->mID.setValue(string(post.guid));
    entry->mTitle.setValue(string(post.title));
    entry->mCurrent.setValue(true);
    entry->mDatePublished.setValue(Date::date(post.published));
    entry->mLocalDateCreated.setValue(Date::date(created));
    if (!post.text.empty()) entry->setContent(makeContent("text/html", post.text));
    if (post.hasSource) {
        entry->setXMLRepresentation(makeContent("application/rss+xml", sourceOf(post)));
    }
    if (post.length != 0) entry->addToEnclosures(makeEnclosure(post.length));
    return entry;
}

}  // namespace

std::string sourceOf(const Post& post) {
    return "<item><guid>" + post.guid + "</guid><title>" + post.title + "</title>" + post.more +
           (post.length != 0 ? std::to_string(post.length) : "") + post.text + "</item>";
}

FeedCore* makeDocument(const char* url, const std::vector<Post>& posts) {
    FeedCore* parsed = makeFeed(url);
    parsed->mTitle.setValue(string("News"));
    double created = Clock::current().now();
    for (const Post& post : posts) {
        const AutoreleasePool pool;
        parsed->addToEntries(makeEntry(post, created -= 0.01));
    }
    return parsed;
}

FeedCore* makeStoredFeed(const char* url) {
    FeedCore* feed = makeFeed(url);
    feed->getIdentifier();
    feed->saveChanges();
    return feed;
}
