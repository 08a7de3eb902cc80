#include "Names.h"

#include "NameMatch.h"

#include <Orvane/OVFeedURLUtils.h>

#include <sstream>

namespace Commands {

namespace {

using NameMatch::Named;

Named named(const OVFeed& feed) {
    return {feed.identifier().value_or(""), feed.URL().value_or(""), feed.title().value_or("")};
}

Named named(const OVEntry& entry) {
    return {entry.identifier().value_or(""), entry.alternateURL().value_or(""),
            entry.titleForDisplay()};
}

template <class T>
std::shared_ptr<T> choose(const std::string& name, const std::vector<std::shared_ptr<T>>& all,
                          const char* kind) {
    std::vector<Named> things;
    for (const std::shared_ptr<T>& each : all) {
        things.push_back(named(*each));
    }
    return all[NameMatch::find(name, things, kind)];
}

/// Those that a name may mean. They are found by the database, as there may be very many.
OVEntry::List candidates(const OVClient& client, const std::string& name) {
    OVEntryQuery query;
    if (NameMatch::isPrefix(name)) {
        query.identifierPrefix = name;
        const OVEntry::List found = client.entries(query);
        if (!found.empty()) return found;
    }
    query = {};
    query.alternateURL = name;
    const OVEntry::List found = client.entries(query);
    if (!found.empty()) return found;
    query = {};
    std::istringstream words(name);
    for (std::string word; words >> word;) {
        query.words.push_back(word);
    }
    return client.entries(query);
}

}  // namespace

std::shared_ptr<OVFeed> Names::feed(const OVClient& client, const std::string& name) {
    const bool isForm = OVFeedURLUtils::_webIsFeedProtocolURL(name);
    const auto source = isForm ? OVFeedURLUtils::sourceURLForFeedURL(name) : std::nullopt;
    return choose(source.value_or(name), client.feeds(), "feed");
}

std::vector<std::shared_ptr<OVFeed>> Names::feeds(const OVClient& client,
                                                  const std::vector<std::string>& names) {
    std::vector<std::shared_ptr<OVFeed>> all;
    for (const std::string& name : names) {
        all.push_back(feed(client, name));
    }
    return all;
}

std::shared_ptr<OVEntry> Names::entry(const OVClient& client, const std::string& name) {
    return choose(name, candidates(client, name), "entry");
}

OVEntry::List Names::entries(const OVClient& client, const std::vector<std::string>& names) {
    OVEntry::List all;
    for (const std::string& name : names) {
        all.push_back(entry(client, name));
    }
    return all;
}

std::string Names::titleOf(const OVFeed& feed) {
    const std::string title = feed.title().value_or("");
    return title.empty() ? feed.URL().value_or("") : title;
}

}  // namespace Commands
