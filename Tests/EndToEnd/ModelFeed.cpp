#include "EndToEnd/ModelFeed.h"

#include <glib.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <utility>

namespace {

constexpr long long kHTTPErrors = 4;
constexpr long long kURLErrors = 15;
constexpr long long kOrvaneErrors = 1002;
constexpr int kNotAFeed = 2;
constexpr int kConnectionLost = -1005;
constexpr int kBadResponse = -1011;
constexpr double kEntryInterval = 0.01;

/// Whether a change of the network may heal it.
bool isOfNetwork(const ModelError& error) {
    return error.domain == kURLErrors && error.code == kConnectionLost;
}

std::string hostOf(const std::string& url) {
    return url.substr(0, url.find('/', 8));
}

}  // namespace

std::string sha1(const std::string& bytes) {
    gchar* text = g_compute_checksum_for_data(
        G_CHECKSUM_SHA1, reinterpret_cast<const guchar*>(bytes.data()), bytes.size());
    std::string result = text;
    g_free(text);
    return result;
}

ModelFeed::ModelFeed(std::string address, double now)
    : url(std::move(address)), identifier(sha1(url)), since(now) {}

std::string ModelFeed::identifierOf(const FeedContent& feed, const Post& post) const {
    return sha1(identifier + keyOf(feed, post));
}

/// A refresh on its way from answer to answer.
struct ModelFeed::Trail {
    double now;
    std::deque<Served> served;
    bool force;
    RefusedHosts& refused;
    std::string first;      ///< what was asked for at first
    std::string at;         ///< what is asked for now
    std::string permanent;  ///< where permanent moves have led
    bool isPermanent = true;

    void begin(const std::string& address) {
        first = at = permanent = address;
        isPermanent = true;
    }
};

void ModelFeed::refresh(double now, std::deque<Served> served, bool force, RefusedHosts& refused) {
    Trail trail{now, std::move(served), force, refused, {}, {}, {}};
    trail.begin(redirected.value_or(url));
    for (int steps = 0; takeNext(trail); ++steps) {
        ASSERT_LT(steps, 50) << url;
    }
    EXPECT_TRUE(trail.served.empty()) << "asked for more than it needs: " << url;
}

/// Whether there is more to come.
bool ModelFeed::takeNext(Trail& trail) {
    const auto until = trail.refused.find(hostOf(trail.at));
    if (until != trail.refused.end() && until->second > trail.now) {
        const bool goesOn = trail.first != url;
        fail(trail, {kHTTPErrors, 429});
        return goesOn;
    }
    if (trail.served.empty()) {
        ADD_FAILURE() << "ended without an answer to " << trail.at;
        return false;
    }
    const Served served = trail.served.front();
    trail.served.pop_front();
    EXPECT_EQ(served.url, trail.at);
    checkConditions(served, trail.force);
    const bool goesOn = trail.first != url;
    switch (served.kind) {
        case Served::Kind::Redirect:
            trail.isPermanent = trail.isPermanent && served.status != 302;
            trail.at = served.location;
            if (trail.isPermanent) trail.permanent = trail.at;
            return true;
        case Served::Kind::Failure:
            if (served.retryAfter > 0) {
                trail.refused[hostOf(trail.at)] = trail.now + served.retryAfter;
            }
            fail(trail, {kHTTPErrors, served.status});
            return goesOn;
        case Served::Kind::Break:
            // On a connection that was there already a broken one is tried again beneath us.
            while (!trail.served.empty() && trail.served.front().kind == Served::Kind::Break &&
                   trail.served.front().url == served.url) {
                trail.served.pop_front();
            }
            fail(trail, {kURLErrors, kConnectionLost});
            return goesOn;
        case Served::Kind::BadBody:
            fail(trail, {kURLErrors, kBadResponse});
            return goesOn;
        case Served::Kind::NotModified:
            end(trail, {});
            return false;
        case Served::Kind::Document:
            takeDocument(trail, served);
            return false;
    }
    return false;
}

void ModelFeed::checkConditions(const Served& served, bool force) const {
    EXPECT_EQ(served.ifNoneMatch, force ? "" : eTag) << url;
    EXPECT_EQ(served.ifModifiedSince, force ? "" : lastModified) << url;
}

/// What a move has led to is given up for the first address, once.
void ModelFeed::fail(Trail& trail, ModelError failure) {
    refreshed = trail.now;
    if (trail.first != url) {
        trail.begin(url);
    } else {
        end(trail, failure);
    }
}

void ModelFeed::end(Trail& trail, ModelError result) {
    refreshed = trail.now;
    // That the network is down does not hide what the server said.
    if (isOfNetwork(result) && error.code != 0 && !isOfNetwork(error)) return;
    error = result;
}

void ModelFeed::takeDocument(Trail& trail, const Served& served) {
    eTag = served.version->eTag;
    lastModified = served.version->lastModified;
    const bool isNew = trail.force || !document || document->bytes != served.version->bytes;
    document = served.version;
    if (!isNew) return end(trail, {});
    if (!document->feed) return end(trail, {kOrvaneErrors, kNotAFeed});
    if (merge(trail, *document->feed)) recount();
    end(trail, {});
}

/// Whether any entry has changed.
bool ModelFeed::merge(Trail& trail, const FeedContent& feed) {
    // By whole seconds, as documents say it.
    if (!trail.force && feed.date && date == feed.date) return false;
    redirected.reset();
    if (trail.permanent != url) redirected = trail.permanent;
    title = feed.title;
    date = feed.date;
    return mergeEntries(trail.now, feed);
}

bool ModelFeed::mergeEntries(double now, const FeedContent& feed) {
    std::map<std::string, bool> present;
    bool changed = false;
    double created = now;
    for (const Post& post : feed.posts) {
        const std::string name = identifierOf(feed, post);
        present[name] = true;
        created -= kEntryInterval;
        const auto [place, isNew] = entries.try_emplace(name);
        ModelEntry& entry = place->second;
        if (isNew) entry.created = created;
        changed = changed || isNew || !entry.current || entry.post != post;
        entry.current = true;
        entry.post = post;
        entry.content = storedContentOf(feed, post);
        entry.contentType = contentTypeOf(feed);
    }
    for (auto& [name, entry] : entries) {
        if (!entry.current || present.contains(name)) continue;
        entry.current = false;
        changed = true;
    }
    return changed;
}

int ModelFeed::countUnread(const ModelSubscription& subscription) const {
    return static_cast<int>(std::count_if(entries.begin(), entries.end(), [&](const auto& each) {
        return !each.second.read && each.second.created > subscription.expirationDate.value_or(0);
    }));
}

bool ModelFeed::missesNetwork() const {
    return isOfNetwork(error);
}

void ModelFeed::recount() {
    for (auto& [client, subscription] : subscriptions)
        subscription.unread = countUnread(subscription);
}

int ModelFeed::expunge() {
    // The most patient subscription counts.
    std::optional<double> limit;
    for (const auto& [client, each] : subscriptions) {
        if (each.expirationDate && (!limit || *each.expirationDate < *limit)) {
            limit = each.expirationDate;
        }
    }
    if (!limit) return 0;
    return static_cast<int>(std::erase_if(entries, [&](const auto& each) {
        const ModelEntry& entry = each.second;
        return entry.created < *limit && !entry.current && !entry.flagged;
    }));
}
