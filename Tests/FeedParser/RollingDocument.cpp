#include "FeedParser/RollingDocument.h"

#include "Foundation/String.h"
#include "Foundation/URL.h"
#include "Model/FeedCore.h"
#include "SQLite/Database.h"
#include "SQLite/Transaction.h"

#include <cstdlib>

using namespace Foundation;
using namespace Orvane;

std::vector<Post> RollingDocument::posts(int number) {
    std::vector<Post> posts;
    for (int i = number + kPosts; i > number; --i) {
        Post post{"post-" + std::to_string(i), "Title " + std::to_string(i)};
        if (i == number + kPosts / 2) post.title += " mended";
        post.text = "Text of " + post.title;
        post.length = i % 2 == 0 ? i : 0;
        posts.push_back(post);
    }
    if (number % 3 == 0) posts.push_back({"first", "The first"});
    return posts;
}

FeedCore* RollingDocument::make(int number) {
    FeedCore* parsed = makeDocument(kURL, posts(number));
    parsed->mTitle.setValue(String::string(std::to_string(number)));
    return parsed;
}

Returner<FeedCore> RollingDocument::storedFeed() {
    const Ref<URL> url = URL::url(String::string(std::string(kURL)));
    Ref<FeedCore> feed = FeedCore::existingFeedWithURL(url);
    if (feed.get()) return feed;
    const SQLite::Transaction transaction(true);
    feed = makeStoredFeed(kURL);
    SQLite::gDatabase->execute("insert into Clients (rowID, signature) values (1, 'reader')");
    SQLite::gDatabase->execute(
        "insert into Subscriptions (rowID, client, feed, expirationDate, unreadCount) "
        "values (1, 1, %lld, 0, 0)",
        feed->getRowID());
    return feed;
}

int RollingDocument::numberOf(const FeedCore& feed) {
    const String* title = feed.mTitle.getValue();
    return title ? std::atoi(title->utf8().c_str()) : 0;
}
