#include "EndToEnd/ScriptedFeed.h"

#include "Support/Coded.h"

#include <algorithm>
#include <utility>

using Support::ServerAnswer;
using Support::ServerRequest;

namespace {

constexpr int kAway = -1;  ///< the place where a feed is for a while

const std::shared_ptr<const Version>& rubbish() {
    static const auto sRubbish = std::make_shared<const Version>(
        Version{"<html><head><title>Parked</title></head><body>Buy me</body></html>", {}, {}, {}});
    return sRubbish;
}

}  // namespace

ScriptedFeed::ScriptedFeed(int number, std::string address, unsigned seed, const World& world)
    : mNumber(number),
      mAddress(std::move(address)),
      mWorld(world),
      mRandom(seed + static_cast<unsigned>(number) * 7919),
      mUsesETags(number % 3 == 0 || number % 6 == 1),
      mUsesDates(number % 3 == 1),
      mUsesGzip(number % 4 == 1) {
    mContent.dialect = static_cast<Dialect>(number % 6);
    mContent.writing = static_cast<Writing>(number / 6 % 5);
    if (number % 5 == 2) mContent.encoding = "iso-8859-1";
    mContent.title = "K\u00e4se & Brot " + std::to_string(number);
    mContent.home = "http://pages.example/" + std::to_string(number) + "/";
    if (number % 7 == 3) mContent.date = world.now();
    write(between(1, static_cast<int>(kPosts)));
    publish(world.now());
}

std::string ScriptedFeed::pathOf(int place) const {
    const std::string path = "/" + std::to_string(mNumber);
    if (place == 0) return path;
    return path + (place == kAway ? "/away" : "/place" + std::to_string(place));
}

std::deque<Served> ScriptedFeed::takeServed(double time) {
    const std::scoped_lock lock(mMutex);
    std::deque<Served> taken;
    for (; !mServed.empty() && mServed.front().time <= time; mServed.pop_front()) {
        if (mServed.front().time == time) taken.push_back(std::move(mServed.front()));
    }
    return taken;
}

void ScriptedFeed::setReachable(bool reachable) {
    const std::scoped_lock lock(mMutex);
    mIsReachable = reachable;
}

// What happens.

void ScriptedFeed::live() {
    const double now = mWorld.now();
    const FeedContent before = mContent;
    if (happens(30)) write(between(1, 3));
    if (happens(20)) change();
    if (happens(8)) lose();
    if (happens(8)) bringBack();
    if (happens(4)) move();
    if (happens(mTrouble == Trouble::None ? 4 : 50)) changeTrouble();
    // Some say nothing of the change: it counts for nothing.
    const bool says = mContent.date && !happens(15);
    if (before.posts != mContent.posts) publish(says ? now : mContent.date.value_or(now));
}

Post ScriptedFeed::newPost() {
    Post post;
    post.number = mNextPost++;
    post.hasGUID = mContent.dialect >= Dialect::RSS20 && mNumber % 4 != 2;
    post.link = mContent.home + std::to_string(post.number);
    if (post.number % 4 == 0 && mContent.dialect != Dialect::RSS10 &&
        mContent.dialect != Dialect::RSS091) {
        post.enclosure = "http://files.example/" + std::to_string(mNumber) + "/" +
                         std::to_string(post.number) + ".mp3";
        post.enclosureLength = 1000 + post.number;
    }
    mend(post);
    return post;
}

void ScriptedFeed::mend(Post& post) const {
    const std::string version = std::to_string(post.version);
    post.title = "\u00dcber " + std::to_string(post.number) + " & version " + version;
    post.html = "<p>Post <b>" + std::to_string(post.number) + "</b> of feed " +
                std::to_string(mNumber) + ", version " + version + ".</p>";
    if (!post.enclosure.empty()) post.enclosureLength = 1000 * post.version + post.number;
}

void ScriptedFeed::write(int count) {
    for (; count > 0; --count)
        mContent.posts.insert(mContent.posts.begin(), newPost());
    while (mContent.posts.size() > kPosts) {
        mLost.push_back(mContent.posts.back());
        mContent.posts.pop_back();
    }
}

void ScriptedFeed::change() {
    if (mContent.posts.empty()) return;
    Post& post = mContent.posts[static_cast<std::size_t>(
        between(0, static_cast<int>(mContent.posts.size()) - 1))];
    ++post.version;
    mend(post);
}

/// One of several goes; the last one stays, as a document without any says nothing.
void ScriptedFeed::lose() {
    if (mContent.posts.size() < 2) return;
    const auto place =
        mContent.posts.begin() + between(0, static_cast<int>(mContent.posts.size()) - 1);
    mLost.push_back(*place);
    mContent.posts.erase(place);
}

void ScriptedFeed::bringBack() {
    if (mLost.empty() || mContent.posts.size() >= kPosts) return;
    mContent.posts.push_back(mLost.back());
    mLost.pop_back();
}

void ScriptedFeed::move() {
    const std::scoped_lock lock(mMutex);
    switch (between(0, 3)) {
        case 0:
            mIsAway = !mIsAway;
            break;
        case 1:
            mPlace = 0;
            break;
        default:
            ++mPlace;
            mMoveStatus = happens(50) ? 301 : 308;
            break;
    }
}

void ScriptedFeed::changeTrouble() {
    const std::scoped_lock lock(mMutex);
    if (mTrouble == Trouble::Gone) return;
    const bool hadTrouble = mTrouble != Trouble::None;
    mTrouble = hadTrouble ? Trouble::None
                          : static_cast<Trouble>(between(1, static_cast<int>(Trouble::Truncated)));
    mRetryAfter = between(1, 12) * 3600;
}

void ScriptedFeed::publish(double date) {
    if (mContent.date) mContent.date = date;
    Version version;
    version.bytes = documentOf(mContent);
    version.feed = mContent;
    const std::string number = std::to_string(mNextVersion++);
    if (mUsesETags) version.eTag = "\"" + number + "-" + std::to_string(mNumber) + "\"";
    // Nobody but the server reads it.
    if (mUsesDates) {
        version.lastModified = "Mon, 02 Jan 2040 0" +
                               std::string(1, static_cast<char>('0' + mNextVersion / 60 % 8)) +
                               ":" + (mNextVersion % 60 < 10 ? "0" : "") +
                               std::to_string(mNextVersion % 60) + ":00 GMT";
    }
    const std::scoped_lock lock(mMutex);
    mVersion = std::make_shared<const Version>(std::move(version));
}

// What is served.

ServerAnswer ScriptedFeed::answer(const ServerRequest& request) {
    const std::scoped_lock lock(mMutex);
    Served served;
    served.time = mWorld.now();
    served.url = mAddress + request.path();
    served.ifNoneMatch = request.header("if-none-match");
    served.ifModifiedSince = request.header("if-modified-since");
    ServerAnswer answer;
    const std::string path = request.path();
    if (!mIsReachable) {
        answer = breakOff(served);
    } else if (path == pathOf(mPlace)) {
        answer = mIsAway ? redirect(served, 302, pathOf(kAway)) : answerAtHome(request, served);
    } else if (path == pathOf(kAway) && mIsAway) {
        answer = answerAtHome(request, served);
    } else if (mPlace > 0 && path != pathOf(kAway)) {
        answer = redirect(served, mMoveStatus, pathOf(mPlace));
    } else {
        answer = fail(served, 404);
    }
    mServed.push_back(served);
    return answer;
}

ServerAnswer ScriptedFeed::answerAtHome(const ServerRequest& request, Served& served) {
    if (mTrouble != Trouble::None) return answerInTrouble(served);
    const bool hasIt = !mVersion->eTag.empty()
                           ? request.header("if-none-match") == mVersion->eTag
                           : !mVersion->lastModified.empty() &&
                                 request.header("if-modified-since") == mVersion->lastModified;
    if (!hasIt) return document(mVersion, served);
    served.kind = Served::Kind::NotModified;
    served.status = 304;
    return ServerAnswer(304);
}

ServerAnswer ScriptedFeed::answerInTrouble(Served& served) const {
    switch (mTrouble) {
        case Trouble::NotFound:
            return fail(served, 404);
        case Trouble::Gone:
            return fail(served, 410);
        case Trouble::Internal:
            return fail(served, 500);
        case Trouble::TooMany:
            served.retryAfter = mRetryAfter;
            return fail(served, 429)
                .header("Retry-After", std::to_string(static_cast<int>(mRetryAfter)));
        case Trouble::Reset:
            return breakOff(served);
        case Trouble::Truncated: {
            served.kind = Served::Kind::BadBody;
            const std::string whole = Support::gzipped(mVersion->bytes);
            return ServerAnswer()
                .header("Content-Encoding", "gzip")
                .header("ETag", "\"broken\"")
                .body(whole.substr(0, whole.size() / 2));
        }
        case Trouble::Rubbish:
        case Trouble::None:
            break;
    }
    return document(rubbish(), served);
}

ServerAnswer ScriptedFeed::breakOff(Served& served) {
    served.kind = Served::Kind::Break;
    return ServerAnswer::raw("").reset();
}

ServerAnswer ScriptedFeed::fail(Served& served, int status) {
    served.kind = Served::Kind::Failure;
    served.status = status;
    return ServerAnswer(status).body("no");
}

ServerAnswer ScriptedFeed::redirect(Served& served, int status, const std::string& location) {
    served.kind = Served::Kind::Redirect;
    served.status = status;
    served.location = served.url.substr(0, served.url.find('/', 7)) + location;
    return ServerAnswer::redirect(status, location);
}

ServerAnswer ScriptedFeed::document(const std::shared_ptr<const Version>& version,
                                    Served& served) const {
    served.version = version;
    ServerAnswer answer;
    if (!version->eTag.empty()) answer.header("ETag", version->eTag);
    if (!version->lastModified.empty()) answer.header("Last-Modified", version->lastModified);
    if (!mUsesGzip) return answer.body(version->bytes);
    return answer.header("Content-Encoding", "gzip").body(Support::gzipped(version->bytes));
}
