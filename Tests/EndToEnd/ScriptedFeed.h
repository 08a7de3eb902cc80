#pragma once

#include "EndToEnd/FeedDocument.h"
#include "EndToEnd/World.h"
#include "Support/ScriptedServer.h"

#include <deque>
#include <memory>
#include <mutex>
#include <random>
#include <string>
#include <vector>

/// A document as it was served.
struct Version {
    std::string bytes;                ///< without a content coding
    std::optional<FeedContent> feed;  ///< none if it is none
    std::string eTag;                 ///< empty if it has none, as the next
    std::string lastModified;
};

/// The answer to one request.
struct Served {
    enum class Kind {
        Document,
        NotModified,
        Redirect,
        Failure,
        Break,    ///< a broken connection
        BadBody,  ///< a coding that ends too early
    };

    Kind kind = Kind::Document;
    double time = 0;
    std::string url;              ///< that was asked for
    std::string ifNoneMatch;      ///< what was said with it
    std::string ifModifiedSince;  ///< the same
    int status = 200;
    std::string location = {};                         ///< of a redirect
    double retryAfter = 0;                             ///< seconds; 0 for none
    std::shared_ptr<const Version> version = nullptr;  ///< of a document
};

/// A feed of the web with a life of its own: it grows, changes and loses posts, moves, is in
/// trouble and out of it again. All of it is drawn from a seed. `answer` is called in the server's
/// thread, everything else in the test's.
class ScriptedFeed {
 public:
    /// What is the matter with it.
    enum class Trouble {
        None,
        NotFound,
        Gone,  ///< for good
        Internal,
        TooMany,    ///< wants to be left alone
        Reset,      ///< breaks connections
        Rubbish,    ///< serves something else
        Truncated,  ///< a gzip that ends too early
    };

    /// `address` is that of the server, as this feed's host.
    ScriptedFeed(int number, std::string address, unsigned seed, const World& world);

    /// Its first address, under which it is subscribed to.
    std::string getURL() const { return mAddress + pathOf(0); }
    /// Something may happen to it.
    void live();
    /// Whether anybody can reach it.
    void setReachable(bool reachable);
    Support::ServerAnswer answer(const Support::ServerRequest& request);
    /// The answers at this time. Those before it, which nobody has taken, are dropped.
    std::deque<Served> takeServed(double time);

 private:
    static constexpr std::size_t kPosts = 8;  ///< in a document

    bool happens(int percent) { return between(0, 99) < percent; }
    int between(int least, int most) {
        return std::uniform_int_distribution<int>(least, most)(mRandom);
    }
    std::string pathOf(int place) const;

    void write(int count);
    void change();
    void lose();
    void bringBack();
    void move();
    void changeTrouble();
    void publish(double date);
    Post newPost();
    void mend(Post& post) const;

    Support::ServerAnswer answerAtHome(const Support::ServerRequest& request, Served& served);
    Support::ServerAnswer answerInTrouble(Served& served) const;
    static Support::ServerAnswer breakOff(Served& served);
    static Support::ServerAnswer fail(Served& served, int status);
    static Support::ServerAnswer redirect(Served& served, int status, const std::string& location);
    Support::ServerAnswer document(const std::shared_ptr<const Version>& version,
                                   Served& served) const;

    const int mNumber;
    const std::string mAddress;
    const World& mWorld;
    std::mt19937 mRandom;
    bool mUsesETags = false;
    bool mUsesDates = false;
    bool mUsesGzip = false;
    int mNextPost = 1;
    int mNextVersion = 1;
    FeedContent mContent;
    std::vector<Post> mLost;  ///< those that left the document

    std::mutex mMutex;     ///< for all that follows
    int mPlace = 0;        ///< where it is; it leads there from where it was
    bool mIsAway = false;  ///< for a while, somewhere else
    int mMoveStatus = 301;
    bool mIsReachable = true;
    Trouble mTrouble = Trouble::None;
    double mRetryAfter = 0;
    std::shared_ptr<const Version> mVersion;
    std::deque<Served> mServed;
};
