#pragma once

#include "EndToEnd/ScriptedFeed.h"

#include <deque>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

/// What the store must have of an entry.
struct ModelEntry {
    Post post;
    std::string content;
    std::string contentType;
    double created = 0;  ///< when it was first seen
    bool current = true;
    bool read = false;
    bool flagged = false;
};

/// The same of a client's subscription. A 0 stands for what the client has set for all.
struct ModelSubscription {
    std::string client;
    double refresh = 0;
    double expiration = 0;
    std::optional<double> expirationDate;
    int unread = 0;
};

/// An error as it is kept: domain and code.
struct ModelError {
    long long domain = 0;
    int code = 0;

    bool operator==(const ModelError&) const = default;
};

/// Until when hosts want to be left alone.
using RefusedHosts = std::map<std::string, double>;

/// What the store must have of a feed, by the rules for refreshes and merges: written anew, of
/// nothing but what was served.
class ModelFeed {
 public:
    ModelFeed(std::string address, double now);

    /// A refresh has ended, in which this was served. `force`: somebody has asked for it.
    void refresh(double now, std::deque<Served> served, bool force, RefusedHosts& refused);
    /// Whether the last refresh failed for want of a network.
    bool missesNetwork() const;
    /// The unread count of every subscription is computed anew.
    void recount();
    /// How many are unread for a subscription.
    int countUnread(const ModelSubscription& subscription) const;
    /// Old entries go. How many these were.
    int expunge();

    /// The name of an entry in the store.
    std::string identifierOf(const FeedContent& feed, const Post& post) const;

    const std::string url;
    const std::string identifier;
    double since;  ///< when its schedule was last changed
    std::optional<std::string> redirected;
    std::string eTag;
    std::string lastModified;
    std::shared_ptr<const Version> document;  ///< the last one that came
    double refreshed = 0;                     ///< 0 for never
    ModelError error;
    std::string title;
    std::optional<double> date;  ///< what it says of its last change
    std::map<std::string, ModelEntry> entries;
    std::map<std::string, ModelSubscription> subscriptions;  ///< by client

 private:
    struct Trail;

    bool takeNext(Trail& trail);
    void fail(Trail& trail, ModelError failure);
    void end(Trail& trail, ModelError result);
    void takeDocument(Trail& trail, const Served& served);
    bool merge(Trail& trail, const FeedContent& feed);
    bool mergeEntries(double now, const FeedContent& feed);

    void checkConditions(const Served& served, bool force) const;
};

/// 40 hexadecimal digits.
std::string sha1(const std::string& bytes);
