#include "FeedParser/Info.h"

#include "Foundation/Clock.h"

namespace Orvane::FeedParser {

using Foundation::Date;
using Foundation::MutableArrayOf;
using Foundation::Ref;

namespace {

constexpr double kEntryInterval = 0.01;  ///< seconds between the entries of a document

template <class T>
void addTo(Ref<MutableArrayOf<T>>& list, T* element) {
    if (!list.get()) list = MutableArrayOf<T>::array();
    list->add(element);
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

}  // namespace Orvane::FeedParser
