#include "EventRecorder.h"

#include "DateText.h"
#include "Names.h"

#include <algorithm>
#include <utility>

namespace Commands {

namespace {

Listing emptyList() {
    return {"events",
            {{"time", "TIME"},
             {"event", "EVENT"},
             {"id", "ID"},
             {"feed", "FEED"},
             {"title", "TITLE"},
             {"url", "URL"},
             {"feedId"},
             {"feedUrl"},
             {"unread"}},
            {}};
}

}  // namespace

EventRecorder::EventRecorder(OVClient& client, std::vector<std::shared_ptr<OVFeed>> feeds)
    : mClient(client), mFeeds(std::move(feeds)), mEvents(emptyList()) {
    mClient.setDelegate(this);
}

EventRecorder::~EventRecorder() {
    mClient.setDelegate(nullptr);
}

Listing EventRecorder::take() {
    return std::exchange(mEvents, emptyList());
}

void EventRecorder::add(const char* event, const OVFeed& feed, const OVEntry* entry, Value id) {
    const bool isWanted =
        mFeeds.empty() || std::any_of(mFeeds.begin(), mFeeds.end(),
                                      [&](const auto& each) { return each.get() == &feed; });
    if (!isWanted) return;
    mEvents.rows.push_back(
        {{DateText::now(), std::string(event), entry ? valueOf(entry->identifier()) : std::move(id),
          Names::titleOf(feed), entry ? Value(entry->titleForDisplay()) : Value(),
          entry ? valueOf(entry->alternateURL()) : Value(), valueOf(feed.identifier()),
          valueOf(feed.URL()), static_cast<long long>(feed.unreadCount())}});
}

void EventRecorder::addAll(const char* event, const OVFeed& feed, const OVEntry::List& entries) {
    for (const std::shared_ptr<OVEntry>& entry : entries) {
        add(event, feed, entry.get());
    }
}

void EventRecorder::feedDidBeginRefresh(const std::shared_ptr<OVFeed>& feed) {
    add("refresh-began", *feed, nullptr);
}

void EventRecorder::feedDidEndRefresh(const std::shared_ptr<OVFeed>& feed) {
    add("refresh-ended", *feed, nullptr);
}

void EventRecorder::feedDidAddEntries(const std::shared_ptr<OVFeed>& feed,
                                      const OVEntry::List& entries) {
    addAll("added", *feed, entries);
}

void EventRecorder::feedDidRemoveEntriesWithIdentifiers(const std::shared_ptr<OVFeed>& feed,
                                                        const std::vector<std::string>& ids) {
    for (const std::string& id : ids) {
        add("removed", *feed, nullptr, id);
    }
}

void EventRecorder::feedDidUpdateEntries(const std::shared_ptr<OVFeed>& feed,
                                         const OVEntry::List& entries) {
    addAll("changed", *feed, entries);
}

void EventRecorder::feedDidChangeFlagsInEntries(const std::shared_ptr<OVFeed>& feed,
                                                const OVEntry::List& entries) {
    addAll("flags", *feed, entries);
}

void EventRecorder::feedUnreadCountChanged(const std::shared_ptr<OVFeed>& feed) {
    add("unread", *feed, nullptr);
}

}  // namespace Commands
