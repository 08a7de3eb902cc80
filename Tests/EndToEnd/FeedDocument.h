#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

/// The vocabularies of feeds.
enum class Dialect { RSS091, RSS092, RSS10, RSS20, Atom03, Atom10 };
/// How a document writes the content of a post.
enum class Writing { Escaped, CDATA, XHTML, Base64, Plain };

/// A post of a feed, as its author has it.
struct Post {
    int number = 0;
    int version = 1;        ///< grows with every change
    bool hasGUID = false;   ///< in a document of a dialect that has them
    std::string link;       ///< never changes
    std::string title;      ///< changes with the version, unless it is what the post is known by
    std::string html;       ///< well-formed
    std::string enclosure;  ///< its address; empty for none
    int enclosureLength = 0;

    bool operator==(const Post&) const = default;
};

/// What a feed is at one time.
struct FeedContent {
    Dialect dialect = Dialect::RSS20;
    Writing writing = Writing::Escaped;
    std::string encoding = "utf-8";  ///< or "iso-8859-1"
    std::string title;
    std::string home;            ///< the address of its pages
    std::optional<double> date;  ///< what it says of when it has last changed
    std::vector<Post> posts;     ///< the newest first
};

/// What it says of a post by which the post can be known: its guid, or else its link.
std::string keyOf(const FeedContent& feed, const Post& post);
/// What is to be stored of a post's content, and its media type.
std::string storedContentOf(const FeedContent& feed, const Post& post);
std::string contentTypeOf(const FeedContent& feed);
/// The document, in its encoding.
std::string documentOf(const FeedContent& feed);
