#include "FeedParser/Info.h"

#include "FeedParser/Text/Bounds.h"
#include "Foundation/Clock.h"
#include "Foundation/String.h"

namespace Orvane::FeedParser {

using Foundation::Date;
using Foundation::MutableArrayOf;
using Foundation::Ref;
using Foundation::String;
using Foundation::URL;

namespace {

constexpr double kEntryInterval = 0.01;  ///< seconds between the entries of a document

template <class T>
void addTo(Ref<MutableArrayOf<T>>& list, T* element) {
    if (!list.get()) list = MutableArrayOf<T>::array();
    list->add(element);
}

Foundation::URLReturner makeBaseURL(const char* text) {
    if (!text) return nullptr;
    const Ref<String> string = String::string(text);
    if (!string.get() || string->utf8().size() <= Bounds::kBaseURLBytes) {
        return URL::lenientURL(string.get(), nullptr);
    }
    Bounds::logHit("bytes of a base URL", Bounds::kBaseURLBytes);
    return nullptr;
}

}  // namespace

Info::Info(Parser* theParser, Foundation::URL* theURL)
    : parser(theParser), url(theURL), nextEntryCreationTime(Foundation::Clock::current().now()) {}

void Info::addDefaultAuthor(AuthorCore* author) {
    if (!author->isEmpty()) addTo(defaultAuthors, author);
}

void Info::addDefaultContributor(AuthorCore* author) {
    if (!author->isEmpty()) addTo(defaultContributors, author);
}

void Info::addLink(HTMLLink* link) {
    addTo(links, link);
}

Foundation::DateReturner Info::getNextEntryCreationDate() {
    nextEntryCreationTime -= kEntryInterval;
    return Date::date(nextEntryCreationTime);
}

Foundation::URLReturner Info::getBaseURL(const char* text) {
    if (text != mBaseText) {
        mBaseText = text;
        mBaseURL = makeBaseURL(text);
    }
    return mBaseURL;
}

}  // namespace Orvane::FeedParser
