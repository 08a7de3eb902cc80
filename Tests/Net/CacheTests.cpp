#include "Net/ResponseCache.h"

#include "Net/CacheDirectives.h"
#include "NetTest.h"
#include "Support/TempDir.h"

using namespace Orvane;

namespace {

using Notes = std::vector<std::string>;
using Headers = std::vector<HTTPHeader>;

class CacheTest : public NetTest {
 protected:
    /// Fetches an address whose server sends this, and keeps it.
    bool fetchAndCache(Headers headers, double minLifetime, const char* body = "body",
                       int status = 200) {
        network().answer("http://a/",
                         {.status = status, .headers = std::move(headers), .body = body});
        mRequest = get("http://a/");
        mRequest->start(true);
        turn();
        return mRequest->cacheResponse(minLifetime);
    }
    double remaining() { return mRequest->getResponse()->getExpirationTime() - mClock.now(); }
    /// What a request that the cache may answer gets, and how many requests were sent for it.
    std::string fetch(CachePolicy policy = CachePolicy::UseProtocol) {
        const std::size_t before = network().asked().size();
        mRequest = get("http://a/");
        mRequest->setCachePolicy(policy);
        mRequest->start(true);
        turn();
        const bool isSent = network().asked().size() > before;
        const std::string result(Foundation::Data::asBytes(mRequest->getResponseData()).view());
        mRequest->stop();
        return isSent ? "sent" : result;
    }

    Ref<HTTPRequest> mRequest;
    Support::TempDir mDirectory;
};

TEST_F(CacheTest, KeepsTheServersLifetime) {
    const Support::LoggingOn on({&gLogHTTP});
    const Support::LogCapture log;
    EXPECT_TRUE(fetchAndCache({{"Cache-Control", "max-age=90"}}, 0.0));
    EXPECT_EQ(remaining(), 90);
    EXPECT_EQ(log.count(": Caching response (4 bytes, expires in 1.5 min)"), 1);
    EXPECT_EQ(fetch(), "body");
    mClock.advanceBy(90);
    EXPECT_EQ(fetch(), "sent");
}

TEST_F(CacheTest, KeepsInMemoryWhatTookALogin) {
    network().answer("http://a/",
                     {.status = 401, .headers = {{"WWW-Authenticate", "Basic realm=\"x\""}}});
    network().answer("http://a/", {.headers = {{"Cache-Control", "max-age=90"}}, .body = "secret"});
    mRequest = get("http://a/");
    mRequest->setStoredCredential(text("ann").get(), text("pass").get());
    mRequest->start(true);
    turn();
    EXPECT_EQ(mRequest->getResponseData()->view(), "secret");
    EXPECT_EQ(mRequest->getResponse()->getRecommendedStoragePolicy(),
              StoragePolicy::AllowedInMemoryOnly);
    EXPECT_TRUE(mRequest->cacheResponse(0.0));
    EXPECT_EQ(fetch(), "secret");
}

TEST_F(CacheTest, KeepsNothingForLessThanASecond) {
    const Support::LoggingOn on({&gLogHTTP});
    const Support::LogCapture log;
    EXPECT_FALSE(fetchAndCache({}, 0.0));
    EXPECT_FALSE(fetchAndCache({{"Cache-Control", "max-age=0"}}, 0.0));
    EXPECT_FALSE(fetchAndCache({}, 0.9));
    EXPECT_TRUE(fetchAndCache({{"Cache-Control", "max-age=1"}}, 0.0));
    EXPECT_TRUE(fetchAndCache({}, 1.0));
    EXPECT_EQ(log.count(": Couldn't cache response"), 3);
}

TEST_F(CacheTest, MakesTheLifetimeLonger) {
    EXPECT_TRUE(fetchAndCache({{"Cache-Control", "max-age=90"}}, 86400.0));
    EXPECT_EQ(remaining(), 86400);
    EXPECT_TRUE(fetchAndCache({{"Cache-Control", "max-age=90"}}, 60.0));
    EXPECT_EQ(remaining(), 90);
}

TEST_F(CacheTest, ObeysAServerThatWantsNothingKeptUnlessItIsOverruled) {
    const Support::LoggingOn on({&gLogHTTP});
    const Support::LogCapture log;
    EXPECT_FALSE(fetchAndCache({{"Cache-Control", "no-store, max-age=90"}}, 0.0));
    EXPECT_EQ(log.count(": Couldn't cache response"), 1);
    EXPECT_TRUE(fetchAndCache({{"Cache-Control", "no-store, max-age=90"}}, 10.0));
    EXPECT_EQ(fetch(), "body");
}

TEST_F(CacheTest, KeepsNoEmptyBody) {
    EXPECT_FALSE(fetchAndCache({{"Cache-Control", "max-age=90"}}, 100.0, ""));
    const auto request = get("http://a/");
    EXPECT_FALSE(request->cacheResponse(100.0));
}

TEST_F(CacheTest, DoesNotAnswerUnlessToldTo) {
    EXPECT_TRUE(fetchAndCache({{"Cache-Control", "max-age=90"}}, 0.0));
    network().answer("http://a/", {.body = "new"});
    const auto request = get("http://a/");
    request->start(true);
    turn();
    EXPECT_EQ(request->getResponseData()->view(), "new");
}

TEST_F(CacheTest, DoesNotAnswerUnderAConditionOrForAnotherMethod) {
    EXPECT_TRUE(fetchAndCache({{"Cache-Control", "max-age=90"}}, 0.0));
    const auto conditional = get("http://a/");
    conditional->makeConditional(nullptr, text("\"x\"").get());
    conditional->setCachePolicy(CachePolicy::UseProtocol);
    conditional->start(true);
    const Ref<HTTPRequest> head = Foundation::Returner<HTTPRequest>::adopted(
        new HTTPRequest(url("http://a/").get(), text("HEAD").get()));
    head->setCachePolicy(CachePolicy::UseProtocol);
    head->start(true);
    turn();
    EXPECT_EQ(network().asked().size(), 3u);
    conditional->stop();
    head->stop();
}

TEST_F(CacheTest, AnswersWithWhatIsStaleIfToldTo) {
    EXPECT_TRUE(fetchAndCache({{"Cache-Control", "max-age=90"}}, 0.0));
    mClock.advanceBy(100);
    EXPECT_EQ(fetch(CachePolicy::CacheElseLoad), "body");
}

TEST_F(CacheTest, AnswersWithHeadersAndStatus) {
    EXPECT_TRUE(fetchAndCache({{"Cache-Control", "max-age=90"}, {"Content-Type", "text/x"}}, 0.0));
    mRequest = get("http://a/");
    const RequestRecorder recorder(*mRequest);
    mRequest->setCachePolicy(CachePolicy::UseProtocol);
    mRequest->start(true);
    turn();
    EXPECT_EQ(recorder.notes, (Notes{"opened", "response 200", "data", "finished"}));
    EXPECT_EQ(mRequest->getHTTPResponse()->getHeader("Content-Type"), "text/x");
}

/// A cache on its own.
class ResponseCacheTest : public NetTest {
 protected:
    Ref<ConnectionRequest> request(const char* address) {
        return ConnectionRequest::request(url(address).get(), CachePolicy::UseProtocol, 60);
    }
    void add(ResponseCache& cache, const char* address, const std::string& body, double lifetime,
             StoragePolicy policy = StoragePolicy::Allowed) {
        const auto asked = request(address);
        const Ref<HTTPMessage> message =
            HTTPMessage::response(200, {{"X-One", "1"}, {"X-Two", "a: b"}});
        const Ref<ConnectionResponse> response =
            ConnectionResponse::response(&asked->message(), message, mClock.now());
        response->setExpirationTime(mClock.now() + lifetime);
        const Ref<Foundation::Data> data = Foundation::Data::adopt(body);
        cache.add(Ref<CachedResponse>(CachedResponse::cachedResponse(response, data, policy)).get(),
                  asked);
    }
    /// "-" for nothing.
    std::string find(ResponseCache& cache, const char* address) {
        const Ref<CachedResponse> found = cache.find(request(address).get());
        return found ? std::string(found->getData()->view()) : "-";
    }
    std::size_t files() const {
        const std::filesystem::directory_iterator all(mDirectory.path());
        return static_cast<std::size_t>(std::distance(begin(all), end(all)));
    }

    Support::TempDir mDirectory;
};

TEST_F(ResponseCacheTest, KeepsResponsesOnDisk) {
    {
        ResponseCache cache(mDirectory.path());
        add(cache, "http://a/", std::string("one\n\n\0two", 9), 100);
    }
    ResponseCache cache(mDirectory.path());
    EXPECT_EQ(find(cache, "http://a/"), std::string("one\n\n\0two", 9));
    EXPECT_EQ(find(cache, "http://a/x"), "-");
    const Ref<CachedResponse> found = cache.find(request("http://a/").get());
    EXPECT_EQ(found->getResponse()->getHTTPMessage()->getStatus(), 200);
    EXPECT_EQ(found->getResponse()->getHTTPMessage()->getHeader("X-Two"), "a: b");
    EXPECT_EQ(found->getResponse()->getExpirationTime(), mClock.now() + 100);
}

TEST_F(ResponseCacheTest, KeepsInMemoryWhatMayNotBeOnADisk) {
    ResponseCache cache(mDirectory.path());
    add(cache, "http://a/", "secret", 100, StoragePolicy::AllowedInMemoryOnly);
    EXPECT_EQ(find(cache, "http://a/"), "secret");
    EXPECT_EQ(files(), 0u);
    ResponseCache other(mDirectory.path());
    EXPECT_EQ(find(other, "http://a/"), "-");
}

TEST_F(ResponseCacheTest, MindsNoBrokenFile) {
    ResponseCache cache(mDirectory.path());
    add(cache, "http://a/", "body", 100);
    for (const auto& entry : std::filesystem::directory_iterator(mDirectory.path())) {
        std::filesystem::resize_file(entry.path(), 30);
    }
    EXPECT_EQ(find(cache, "http://a/"), "-");
}

TEST_F(ResponseCacheTest, DropsThoseWhoseTimeEndsFirst) {
    ResponseCache cache(mDirectory.path());
    for (std::size_t i = 0; i < ResponseCache::kMaxResponses + 1; ++i) {
        add(cache, ("http://a/" + std::to_string(i)).c_str(), "x", 1000.0 - static_cast<double>(i));
    }
    EXPECT_EQ(files(), ResponseCache::kMaxResponses);
    EXPECT_EQ(find(cache, "http://a/0"), "x");
    EXPECT_EQ(find(cache, "http://a/64"), "-");
    mClock.advanceBy(10000);
    add(cache, "http://b/", "x", 100);
    EXPECT_EQ(files(), 1u);
}

TEST_F(ResponseCacheTest, BoundsItsSize) {
    for (const std::string& directory : {mDirectory.path().string(), std::string()}) {
        ResponseCache cache(directory);
        const std::string third(ResponseCache::kMaxBytes * 3 / 10, 'x');
        for (const char* address : {"http://a/1", "http://a/2", "http://a/3", "http://a/4"}) {
            add(cache, address, third, address[9] == '2' ? 50 : 100);
        }
        EXPECT_EQ(find(cache, "http://a/2"), "-");
        EXPECT_EQ(find(cache, "http://a/4").size(), third.size());
    }
}

/// What a response says about keeping it.
class LifetimeTest : public NetTest {
 protected:
    std::string told(Headers headers) {
        const Ref<HTTPMessage> message = HTTPMessage::response(200, std::move(headers));
        const CacheDirectives directives = CacheDirectives::of(*message, mClock.now());
        const std::string lifetime =
            directives.lifetime ? OVFormat("%.0f", *directives.lifetime) : "none";
        return (directives.mayBeStored ? "" : "not stored, ") + lifetime;
    }
};

TEST_F(LifetimeTest, IsWhatTheHeadersSay) {
    EXPECT_EQ(told({}), "none");
    EXPECT_EQ(told({{"Cache-Control", "public, Max-Age = 60"}}), "60");
    EXPECT_EQ(told({{"Cache-Control", "max-age=\"60\""}}), "60");
    EXPECT_EQ(told({{"Cache-Control", "max-age=60"}, {"Age", "20"}}), "40");
    EXPECT_EQ(told({{"Cache-Control", "max-age=soon"}}), "0");
    EXPECT_EQ(told({{"Cache-Control", "max-age=60, no-cache"}}), "0");
    EXPECT_EQ(told({{"Pragma", "no-cache"}, {"Expires", "Thu, 01 Jan 2026 00:01:00 GMT"}}), "0");
    EXPECT_EQ(told({{"Cache-Control", "no-store"}}), "not stored, none");
    EXPECT_EQ(told({{"Vary", "*"}}), "not stored, none");
    EXPECT_EQ(told({{"Expires", "Thu, 01 Jan 2026 00:01:00 GMT"}}), "60");
    EXPECT_EQ(told({{"Expires", "Sun, 06 Nov 1994 08:50:37 GMT"},
                    {"Date", "Sun, 06 Nov 1994 08:49:37 GMT"}}),
              "60");
    EXPECT_EQ(told({{"Expires", "0"}}), "0");
    EXPECT_EQ(told({{"Expires", "Thu, 01 Jan 2026 00:01:00 GMT"}, {"Cache-Control", "max-age=5"}}),
              "5");
}

TEST_F(LifetimeTest, DecidesWhereAResponseMayBeKept) {
    const auto policyOf = [&](const char* method, int status, bool hasLogin) {
        const Ref<HTTPMessage> request =
            HTTPMessage::request(text(method).get(), url("http://a/").get());
        if (hasLogin) request->setHeader("Authorization", "Basic x");
        const Ref<HTTPMessage> message = HTTPMessage::response(status, {});
        return static_cast<int>(
            Ref<ConnectionResponse>(ConnectionResponse::response(request, message, 0))
                ->getRecommendedStoragePolicy());
    };
    EXPECT_EQ(policyOf("GET", 200, false), 0);
    EXPECT_EQ(policyOf("GET", 404, false), 0);
    EXPECT_EQ(policyOf("GET", 200, true), 1);
    EXPECT_EQ(policyOf("GET", 206, false), 2);
    EXPECT_EQ(policyOf("GET", 500, false), 2);
    EXPECT_EQ(policyOf("POST", 200, false), 2);
}

}  // namespace
