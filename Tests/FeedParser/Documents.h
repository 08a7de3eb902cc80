#pragma once

#include <string>
#include <vector>

namespace Orvane {
class FeedCore;
}

/// Parsed documents for merges, made by hand.

/// One post of a document.
struct Post {
    std::string guid;
    std::string title = "Title";
    std::string more{};  ///< what else is in its source
    bool hasSource = true;
    double published = 5000;
    long long length = 0;  ///< of its enclosure; none for 0
    std::string text{};    ///< its content; none if it is empty
};

/// The source of a post, as it stands in a document.
std::string sourceOf(const Post& post);

/// A parsed feed of these posts, the newest first, as the parser makes it. The current pool keeps
/// it.
Orvane::FeedCore* makeDocument(const char* url, const std::vector<Post>& posts);

/// A stored feed with an identifier, which the current pool keeps.
Orvane::FeedCore* makeStoredFeed(const char* url);
