#include "Discovery.h"

#include "EventLoop.h"
#include "Failure.h"

#include <Orvane/OVErrorCode.h>
#include <Orvane/OVFeedURLUtils.h>

#include <algorithm>
#include <filesystem>
#include <system_error>

namespace Commands {

namespace {

bool isFeed(OVDocument::LinkKind kind) {
    return kind == OVDocument::LinkKind::RSSFeed || kind == OVDocument::LinkKind::AtomFeed;
}

bool hasScheme(const std::string& word) {
    const std::size_t colon = word.find(':');
    // "example.org:8080/feed" has none.
    return word.find("://") != std::string::npos ||
           (colon != std::string::npos && word.find('.') > colon);
}

std::string fileURL(const std::string& path) {
    return "file://" + std::filesystem::absolute(path).lexically_normal().string();
}

/// Whether something came that is no feed.
bool isOther(const OVError& error) {
    return error.domain() == OVErrorDomain && error.code() == OVNotAFeedError;
}

OVError notAFeed(const std::string& url) {
    OVError error(OVErrorDomain, OVNotAFeedError);
    error.setDescription("There is no feed at " + url + ", and no link to one.");
    return error;
}

}  // namespace

std::vector<std::string> Discovery::sourcesOf(const std::string& word) {
    if (const auto set = OVFeedURLUtils::_webIsFeedsProtocolURL(word)
                             ? OVFeedURLUtils::parseAggregateFeedURL(word)
                             : std::nullopt) {
        return set->urls;
    }
    if (OVFeedURLUtils::_webIsFeedProtocolURL(word)) {
        const auto source = OVFeedURLUtils::sourceURLForFeedURL(word);
        if (!source) throw Failure(ExitStatus::Usage, "\"" + word + "\" names no feed");
        return {*source};
    }
    std::error_code error;
    if (std::filesystem::is_regular_file(word, error)) return {fileURL(word)};
    return {hasScheme(word) ? word : "https://" + word};
}

Discovery::Fetched Discovery::fetch(const std::string& url) {
    Fetched fetched;
    fetched.feed = OVFeed::create(url);
    if (!fetched.feed) throw Failure(ExitStatus::Usage, "feeds cannot be fetched from " + url);
    OVFeed& feed = *fetched.feed;
    if (!feed.refresh(&fetched.error)) return fetched;
    if (EventLoop::turnUntil([&] { return !feed.isRefreshing(); }, kPatience)) {
        fetched.error = feed.lastError();
    } else {
        fetched.error = OVError(OVURLErrorDomain, OVURLErrorTimedOut);
        fetched.error->setDescription(url + " did not answer.");
    }
    fetched.isDocument = !fetched.error || isOther(*fetched.error);
    return fetched;
}

Discovery::Result Discovery::find(const std::string& url) {
    const Fetched fetched = fetch(url);
    Result result;
    result.error = fetched.error;
    if (!fetched.error) result.feeds = {{url, fetched.feed->title().value_or("")}};
    if (!fetched.error || !fetched.isDocument) return result;
    const auto document = fetched.feed->XMLData();
    if (document) result.feeds = linksOf(OVDocument::read(*document, url));
    result.error = result.feeds.empty() ? std::optional(notAFeed(url)) : std::nullopt;
    return result;
}

std::vector<Discovery::Candidate> Discovery::linksOf(const OVDocument& document) {
    std::vector<Candidate> all;
    if (!document.page) return all;
    for (const OVDocument::Link& link : document.page->links) {
        if (!isFeed(link.kind) || !link.url) continue;
        const bool isKnown = std::any_of(all.begin(), all.end(),
                                         [&](const auto& each) { return each.url == *link.url; });
        if (!isKnown) all.push_back({*link.url, link.title.value_or("")});
    }
    return all;
}

}  // namespace Commands
