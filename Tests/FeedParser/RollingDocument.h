#pragma once

#include "FeedParser/Documents.h"
#include "Foundation/Returner.h"

/// The documents of a feed that changes with each: the oldest post leaves, a new one comes, one is
/// changed, and the first of all is there in every third only. The feed's title is the number of
/// its last document.
struct RollingDocument {
    static constexpr const char* kURL = "http://example.org/rolling";
    static constexpr int kPosts = 8;

    static std::vector<Post> posts(int number);
    static Orvane::FeedCore* make(int number);
    /// The feed, made with a subscription if there is none yet.
    static Foundation::Returner<Orvane::FeedCore> storedFeed();
    /// The number of the last document that was merged; 0 for none.
    static int numberOf(const Orvane::FeedCore& feed);
};
