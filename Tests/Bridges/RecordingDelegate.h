#pragma once

#include <Orvane/OVClientDelegate.h>
#include <Orvane/OVNotificationCenter.h>

#include <algorithm>
#include <functional>
#include <memory>
#include <string>
#include <vector>

/// A delegate that writes down what it is told.
class RecordingDelegate : public OVClientDelegate {
 public:
    using Feed = std::shared_ptr<OVFeed>;

    void feedDidBeginRefresh(const Feed& feed) override { note("begin", feed); }
    void feedDidEndRefresh(const Feed& feed) override { note("end", feed); }
    void feedDidAddEntries(const Feed& feed, const OVEntry::List& entries) override {
        note("added" + names(entries), feed);
    }
    void feedDidRemoveEntriesWithIdentifiers(const Feed& feed,
                                             const std::vector<std::string>& all) override {
        std::string text;
        for (const std::string& each : all) {
            text += " " + each;
        }
        note("removed" + text, feed);
    }
    void feedDidUpdateEntries(const Feed& feed, const OVEntry::List& entries) override {
        note("updated" + names(entries), feed);
    }
    void feedDidChangeFlagsInEntries(const Feed& feed, const OVEntry::List& entries) override {
        note("flags" + names(entries), feed);
    }
    void feedUnreadCountChanged(const Feed& feed) override { note("count", feed); }

    std::vector<std::string> told;
    std::shared_ptr<OVFeed> lastFeed;
    std::function<void()> also;

 private:
    static std::string names(const OVEntry::List& entries) {
        std::vector<std::string> all;
        for (const std::shared_ptr<OVEntry>& each : entries) {
            all.push_back(each->identifier().value_or("?"));
        }
        std::sort(all.begin(), all.end());
        std::string text;
        for (const std::string& each : all) {
            text += " " + each;
        }
        return text;
    }
    void note(const std::string& what, const Feed& feed) {
        told.push_back(what);
        lastFeed = feed;
        if (also) also();
    }
};

/// The names of what is announced in the application's centre, while this lives.
class PublicRecorder {
 public:
    std::vector<std::string> names;
    OVNotification last;

 private:
    OVNotificationCenter::Observation mObservation =
        OVNotificationCenter::defaultCenter().addObserver({}, nullptr,
                                                          [this](const OVNotification& posted) {
                                                              names.push_back(posted.name);
                                                              last = posted;
                                                          });
};
