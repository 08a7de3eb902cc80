#include "Net/CurlTransport.h"

#include "Foundation/AutoreleasePool.h"
#include "Net/ConnectionService.h"
#include "NetTest.h"
#include "Support/Coded.h"
#include "Support/EnvVar.h"
#include "Support/ProcessMemory.h"
#include "Support/ScriptedServer.h"
#include "Support/TurnUntil.h"
#include "Support/WebServer.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <netinet/in.h>
#include <sys/socket.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <optional>
#include <set>
#include <utility>

using namespace Orvane;
using Support::Certificates;
using Support::ServerAnswer;

namespace {

using Notes = std::vector<std::string>;

constexpr std::size_t kMiB = std::size_t{1} << 20;

/// Requests through libcurl to servers on the loopback device. The clock stands unless a test moves
/// it, and so no time-out is ever due by itself.
class CurlTransportTest : public testing::Test {
 protected:
    template <class T>
    using Ref = Foundation::Ref<T>;

    CurlTransportTest() : mService(std::make_unique<CurlTransport>(), ConnectionService::Places()) {
        ConnectionService::setShared(&mService);
    }
    ~CurlTransportTest() noexcept override {
        if (mRequest) mRequest->stop();
        ConnectionService::setShared(nullptr);
    }

    static Ref<Foundation::String> text(const std::string& utf8) {
        return Foundation::String::string(utf8);
    }
    HTTPRequest& make(const std::string& address, const char* method = "GET") {
        if (mRequest) mRequest->stop();
        const Ref<Foundation::URL> url = Foundation::URL::url(text(address).get());
        mRequest =
            Foundation::Returner<HTTPRequest>::adopted(new HTTPRequest(url, text(method).get()));
        mRecorder = std::make_unique<RequestRecorder>(*mRequest);
        return *mRequest;
    }
    /// Runs the request to its end, and gives the last thing that it told.
    std::string run() {
        mRequest->start(true);
        EXPECT_TRUE(Support::turnUntil([this] { return mRecorder->isOver; }));
        return mRecorder->notes.back();
    }
    std::string fetch(const std::string& address) {
        make(address);
        return run();
    }
    std::string fetchAs(const std::string& address, const char* password) {
        make(address).setStoredCredential(text("ann").get(), text(password).get());
        return run();
    }
    int status() const {
        const HTTPMessage* response = mRequest->getHTTPResponse();
        return response ? response->getStatus() : 0;
    }
    std::string body() const {
        return std::string(Foundation::Data::asBytes(mRequest->getResponseData()).view());
    }
    /// Fetches what ends in an error, and looks at what that costs.
    void fetchWithinMemory(const std::string& address) {
        const std::size_t before = Support::ProcessMemory::now();
        Support::ProcessMemory::forgetPeak();
        EXPECT_EQ(fetch(address), "failed 15 -1011");
        EXPECT_LT(Support::ProcessMemory::peak(), before + 160 * kMiB);
        {
            const Foundation::AutoreleasePool pool;
            mRequest = nullptr;
        }
        EXPECT_TRUE(
            Support::turnUntil([&] { return Support::ProcessMemory::now() < before + 16 * kMiB; }));
    }

    /// The flags of the descriptors of this process that are connected to the server.
    std::vector<int> connectionFlags() const {
        constexpr int kMaxDescriptor = 1024;
        std::vector<int> flags;
        for (int fd = 0; fd < kMaxDescriptor; ++fd) {
            sockaddr_in peer = {};
            socklen_t length = sizeof peer;
            if (getpeername(fd, reinterpret_cast<sockaddr*>(&peer), &length) != 0) continue;
            if (peer.sin_family != AF_INET || ntohs(peer.sin_port) != mServer.getPort()) continue;
            flags.push_back(fcntl(fd, F_GETFD));
        }
        return flags;
    }

    /// The descriptors that processes would inherit that this one starts.
    static std::set<int> inheritedDescriptors() {
        std::set<int> descriptors;
        for (const auto& entry : std::filesystem::directory_iterator("/proc/self/fd")) {
            const int fd = std::atoi(entry.path().filename().c_str());
            if ((fcntl(fd, F_GETFD) & FD_CLOEXEC) == 0) descriptors.insert(fd);
        }
        return descriptors;
    }

    Foundation::AutoreleasePool mPool;
    FakeCenter mCenter;
    Support::ManualClock mClock;
    Support::ScriptedServer mServer;
    ConnectionService mService;
    Ref<HTTPRequest> mRequest;
    std::unique_ptr<RequestRecorder> mRecorder;
};

TEST_F(CurlTransportTest, Fetches) {
    mServer.answer("/a", ServerAnswer().header("X-Word", " yes ").body("hello"));
    EXPECT_EQ(fetch(mServer.url("/a?q#f")), "finished");
    EXPECT_EQ(body(), "hello");
    EXPECT_EQ(mRequest->getHTTPResponse()->getHeader("x-word"), "yes");
    EXPECT_EQ(mServer.getRequests().front().target, "/a?q");
    EXPECT_EQ(mServer.getRequests().front().header("accept-encoding"), "gzip, deflate, br, zstd");
    EXPECT_EQ(mServer.getRequests().front().header("user-agent").find("Tarnwick-Orvane/"), 0u);
}

TEST_F(CurlTransportTest, KeepsConnections) {
    mServer.answer("/a", ServerAnswer().body("x"));
    mServer.answer("/r", ServerAnswer::redirect(302, "/a"));
    for (int i = 0; i < 3; ++i) {
        EXPECT_EQ(fetch(mServer.url("/r")), "finished");
    }
    EXPECT_EQ(mServer.getConnectionCount(), 1);
    EXPECT_EQ(mServer.getRequestCount(), 6);
}

TEST_F(CurlTransportTest, HandsNoConnectionOnToProcessesItStarts) {
    mServer.answer("/a", ServerAnswer().body("x"));
    EXPECT_EQ(fetch(mServer.url("/a")), "finished");
    EXPECT_EQ(connectionFlags(), std::vector<int>{FD_CLOEXEC});
}

TEST_F(CurlTransportTest, HandsNothingOfItsOwnOnToProcessesItStarts) {
    const std::set<int> before = inheritedDescriptors();
    const CurlTransport another;
    EXPECT_EQ(inheritedDescriptors(), before);
}

TEST_F(CurlTransportTest, MakesNoMoreThanSixConnectionsToAHost) {
    mServer.answer("/a", ServerAnswer().holdHead("gate").body("x"));
    std::vector<Ref<HTTPRequest>> requests;
    std::vector<std::unique_ptr<RequestRecorder>> recorders;
    for (int i = 0; i < 12; ++i) {
        make(mServer.url("/a"));
        mRequest->start(true);
        requests.push_back(mRequest);
        recorders.push_back(std::move(mRecorder));
        mRequest = nullptr;
    }
    EXPECT_TRUE(Support::turnUntil([&] { return mServer.getWaitingCount("gate") == 6; }));
    mServer.letThrough("gate", 12);
    EXPECT_TRUE(Support::turnUntil([&] {
        return std::ranges::all_of(recorders, [](const auto& each) { return each->isOver; });
    }));
    EXPECT_EQ(mServer.getMostConnections(), 6);
    EXPECT_EQ(mServer.getRequestCount(), 12);
}

TEST_F(CurlTransportTest, SendsABody) {
    mServer.answer("/a", ServerAnswer(201));
    make(mServer.url("/a"), "PUT")
        .setBody(Ref<Foundation::Data>(Foundation::Data::adopt("hello")).get());
    EXPECT_EQ(run(), "finished");
    EXPECT_EQ(mServer.getRequests().front().method, "PUT");
    EXPECT_EQ(mServer.getRequests().front().header("content-length"), "5");
    EXPECT_EQ(mServer.getRequests().front().header("expect"), "");
}

TEST_F(CurlTransportTest, AsksForTheHeadAlone) {
    mServer.answerBy("/a", [](const auto&) {
        return ServerAnswer::raw("HTTP/1.1 200 OK\r\nContent-Length: 500\r\n\r\n");
    });
    make(mServer.url("/a"), "HEAD");
    EXPECT_EQ(run(), "finished");
    EXPECT_EQ(mServer.getRequests().front().method, "HEAD");
    EXPECT_EQ(body(), "");
}

TEST_F(CurlTransportTest, ReadsHeadersThatAreWrittenOddly) {
    mServer.answer("/a", ServerAnswer::raw("HTTP/1.1 100 Continue\r\n\r\n"
                                           "HTTP/1.1 103 Early Hints\r\nLink: <x>\r\n\r\n"
                                           "HTTP/1.1 200\r\nA:1\r\nB: one\r\n\t two\r\n"
                                           "Content-Length: 2\r\n\r\nok"));
    EXPECT_EQ(fetch(mServer.url("/a")), "finished");
    const HTTPMessage& response = *mRequest->getHTTPResponse();
    EXPECT_EQ(response.getStatus(), 200);
    EXPECT_EQ(response.getHeader("A"), "1");
    EXPECT_EQ(response.getHeader("B"), "one two");
    EXPECT_FALSE(response.hasHeader("Link"));
    EXPECT_EQ(mRecorder->notes, (Notes{"opened", "response 200", "data", "finished"}));
}

TEST_F(CurlTransportTest, ReadsChunksAndBodiesWithoutALength) {
    mServer.answer("/c", ServerAnswer().chunked().body("ab").body("c"));
    EXPECT_EQ(fetch(mServer.url("/c")), "finished");
    EXPECT_EQ(body(), "abc");
    mServer.answer("/n", ServerAnswer().withoutLength().body("xyz"));
    EXPECT_EQ(fetch(mServer.url("/n")), "finished");
    EXPECT_EQ(body(), "xyz");
}

TEST_F(CurlTransportTest, NoticesAConnectionThatBreaksAtEveryTenthOfABody) {
    const std::string whole(100000, 'x');
    for (std::size_t tenth = 0; tenth < 10; ++tenth) {
        mServer.answerOnce("/a", ServerAnswer()
                                     .claimLength(whole.size())
                                     .body(whole.substr(0, whole.size() * tenth / 10))
                                     .reset());
        EXPECT_EQ(fetch(mServer.url("/a")), "failed 15 -1005") << tenth;
        EXPECT_EQ(mRequest->getResponseData(), nullptr);
    }
}

TEST_F(CurlTransportTest, NoticesAConnectionThatEndsBeforeTheBodyDoes) {
    mServer.answer("/a", ServerAnswer().claimLength(10).body("short").close());
    EXPECT_EQ(fetch(mServer.url("/a")), "failed 15 -1005");
    mServer.answer("/c", ServerAnswer::raw("HTTP/1.1 200 OK\r\nTransfer-Encoding: chunked\r\n\r\n"
                                           "5\r\nhello\r\n")
                             .close());
    EXPECT_EQ(fetch(mServer.url("/c")), "failed 15 -1005");
    mServer.answer("/e", ServerAnswer::raw("").close());
    EXPECT_EQ(fetch(mServer.url("/e")), "failed 15 -1005");
}

TEST_F(CurlTransportTest, TakesNoMoreThanTheLengthThatIsClaimed) {
    mServer.answer("/a", ServerAnswer().claimLength(5).body("hello and more").close());
    EXPECT_EQ(fetch(mServer.url("/a")), "finished");
    EXPECT_EQ(body(), "hello");
}

TEST_F(CurlTransportTest, BelievesALengthNoFurtherThanABodyComes) {
    // 1 TB is claimed: room for it is never asked of the system.
    mServer.answer("/a", ServerAnswer().claimLength(std::uint64_t{1} << 40).body("xyz").close());
    const std::size_t before = Support::ProcessMemory::now();
    Support::ProcessMemory::forgetPeak();
    EXPECT_THAT(fetch(mServer.url("/a")), testing::StartsWith("failed"));
    EXPECT_LT(Support::ProcessMemory::peak(), before + 16 * kMiB);
}

TEST_F(CurlTransportTest, PutsPiecesOfEverySizeTogether) {
    std::string body;
    ServerAnswer answer;
    for (std::size_t size = 1; size <= 256 << 10; size *= 4) {
        const std::string piece(size, static_cast<char>('a' + body.size() % 26));
        answer.body(piece).wait("piece");
        body += piece;
    }
    mServer.answer("/a", answer);
    mServer.letThrough("piece", 100);
    EXPECT_EQ(fetch(mServer.url("/a")), "finished");
    EXPECT_EQ(this->body(), body);
}

TEST_F(CurlTransportTest, TakesNoBodyOf304) {
    mServer.answer("/a", ServerAnswer(304).body("no").close());
    EXPECT_EQ(fetch(mServer.url("/a")), "finished");
    EXPECT_EQ(status(), 304);
    EXPECT_EQ(body(), "");
}

TEST_F(CurlTransportTest, NoticesWhatIsNoHTTP) {
    mServer.answer("/a", ServerAnswer::raw("220 mail.example.org ESMTP\r\n").close());
    const std::string end = fetch(mServer.url("/a"));
    EXPECT_TRUE(end == "failed 15 -1002" || end == "failed 15 -1011") << end;
}

TEST_F(CurlTransportTest, FailsWhereNobodyListens) {
    int port = 0;
    {
        const Support::ScriptedServer ended;
        port = ended.getPort();
    }
    EXPECT_EQ(fetch("http://127.0.0.1:" + std::to_string(port) + "/"), "failed 15 -1004");
}

TEST_F(CurlTransportTest, UndoesEveryCoding) {
    const std::string words(50000, 'w');
    const std::pair<const char*, std::string> codings[] = {{"gzip", Support::gzipped(words)},
                                                           {"deflate", Support::deflated(words)},
                                                           {"br", Support::brotlied(words)},
                                                           {"zstd", Support::zstandarded(words)}};
    for (const auto& [coding, coded] : codings) {
        mServer.answer("/a", ServerAnswer().header("Content-Encoding", coding).body(coded));
        EXPECT_EQ(fetch(mServer.url("/a")), "finished") << coding;
        EXPECT_TRUE(body() == words) << coding;
        const std::string half = coded.substr(0, coded.size() / 2);
        mServer.answer("/a", ServerAnswer().header("Content-Encoding", coding).body(half));
        EXPECT_EQ(fetch(mServer.url("/a")), "failed 15 -1011") << coding;
        mServer.answer("/a",
                       ServerAnswer().header("Content-Encoding", coding).body("\xff" + coded));
        EXPECT_EQ(fetch(mServer.url("/a")), "failed 15 -1011") << coding;
    }
}

TEST_F(CurlTransportTest, EndsABodyWithoutEndWithinItsMemory) {
    mServer.answer("/a", ServerAnswer().body(std::string(kMiB, 'x'), ServerAnswer::kForEver));
    fetchWithinMemory(mServer.url("/a"));
}

TEST_F(CurlTransportTest, EndsABombWithinItsMemory) {
    const std::string bomb = Support::gzipped(std::string(64 * kMiB, 'x'));
    ASSERT_GT(64 * kMiB / bomb.size(), 1000u);
    mServer.answer("/a", ServerAnswer().header("Content-Encoding", "gzip").body(bomb));
    fetchWithinMemory(mServer.url("/a"));
}

TEST_F(CurlTransportTest, EndsAHeadOfMoreThan256KiB) {
    const auto headOf = [](std::size_t lines) {
        std::string head = "HTTP/1.1 200 OK\r\nContent-Length: 0\r\n";
        for (std::size_t i = 0; i < lines; ++i) {
            head += "X-" + std::string(1020, 'x') + ":\r\n";
        }
        return ServerAnswer::raw(head + "\r\n");
    };
    mServer.answer("/good", headOf(250));
    EXPECT_EQ(fetch(mServer.url("/good")), "finished");
    const Support::LogCapture log;
    mServer.answer("/bad", headOf(257));
    EXPECT_EQ(fetch(mServer.url("/bad")), "failed 15 -1011");
    EXPECT_TRUE(log.contains("more than 262144 bytes of headers"));
    mServer.answer(
        "/ever",
        ServerAnswer::raw("HTTP/1.1 200 OK\r\n").body("X-A: b\r\n", ServerAnswer::kForEver));
    EXPECT_EQ(fetch(mServer.url("/ever")), "failed 15 -1011");
    mServer.answer("/line", ServerAnswer::raw("HTTP/1.1 200 OK\r\nX: " + std::string(200000, 'x') +
                                              "\r\n\r\n"));
    EXPECT_EQ(fetch(mServer.url("/line")), "failed 15 -1011");
}

TEST_F(CurlTransportTest, EndsARedirectLoop) {
    mServer.answer("/a", ServerAnswer::redirect(302, "/b"));
    mServer.answer("/b", ServerAnswer::redirect(301, "/a"));
    EXPECT_EQ(fetch(mServer.url("/a")), "failed 15 -1007");
    EXPECT_EQ(mServer.getRequestCount(), 21);
}

TEST_F(CurlTransportTest, KeepsReadingFromAServerThatIsSlow) {
    mServer.answer(
        "/a", ServerAnswer().chunked().body("x").wait("gate").body("y").wait("gate").body("z"));
    make(mServer.url("/a"));
    mRequest->start(true);
    for (std::size_t blocks = 1; blocks < 3; ++blocks) {
        EXPECT_TRUE(Support::turnUntil([&] { return mRecorder->blocks.size() == blocks; }));
        mClock.advanceBy(119);
        mServer.letThrough("gate");
    }
    EXPECT_TRUE(Support::turnUntil([this] { return mRecorder->isOver; }));
    EXPECT_EQ(mRecorder->notes.back(), "finished");
    EXPECT_EQ(body(), "xyz");
}

TEST_F(CurlTransportTest, GivesUpOnAServerThatSaysNothing) {
    mServer.answer("/a", ServerAnswer().holdHead("gate"));
    make(mServer.url("/a"));
    mRequest->start(true);
    EXPECT_TRUE(Support::turnUntil([&] { return mServer.getWaitingCount("gate") == 1; }));
    mClock.advanceBy(121);
    EXPECT_EQ(mRecorder->notes.back(), "failed 15 -1001");
}

TEST_F(CurlTransportTest, GivesUpADocumentThatTricklesIn) {
    ServerAnswer trickle = ServerAnswer().withoutLength().body("x");
    for (int i = 0; i < 60; ++i) {
        trickle.wait("gate").body("x");
    }
    mServer.answer("/a", trickle);
    make(mServer.url("/a"));
    mRequest->start(true);
    for (std::size_t blocks = 1; blocks < 60; ++blocks) {
        ASSERT_TRUE(Support::turnUntil([&] { return mRecorder->blocks.size() == blocks; }));
        mClock.advanceBy(5);
        mServer.letThrough("gate");
    }
    mClock.advanceBy(5);
    EXPECT_EQ(mRecorder->notes.back(), "failed 15 -1001");
}

TEST_F(CurlTransportTest, HandlesCookies) {
    mServer.answer("/set", ServerAnswer()
                               .header("Set-Cookie", "a=1; Max-Age=1000")
                               .header("Set-Cookie", "b=2; Path=/other")
                               .header("Set-Cookie", "c=3; Domain=example.org"));
    mServer.answer("/get", ServerAnswer());
    mServer.answer("/unset", ServerAnswer().header("Set-Cookie", "a=; Max-Age=0"));
    EXPECT_EQ(fetch(mServer.url("/set")), "finished");
    EXPECT_EQ(fetch(mServer.url("/get")), "finished");
    EXPECT_EQ(fetch(mServer.url("/unset")), "finished");
    EXPECT_EQ(fetch(mServer.url("/get")), "finished");
    EXPECT_EQ(mServer.getRequests("/set")[0].header("cookie"), "");
    EXPECT_EQ(mServer.getRequests("/get")[0].header("cookie"), "a=1");
    EXPECT_EQ(mServer.getRequests("/get")[1].header("cookie"), "");
}

TEST_F(CurlTransportTest, SendsCookiesAlongARedirectThatSetsThem) {
    mServer.answer("/a", ServerAnswer::redirect(302, "/b").header("Set-Cookie", "a=1"));
    mServer.answer("/b", ServerAnswer());
    EXPECT_EQ(fetch(mServer.url("/a")), "finished");
    EXPECT_EQ(mServer.getRequests("/b")[0].header("cookie"), "a=1");
}

TEST_F(CurlTransportTest, AnswersADemandForABasicLoginOnce) {
    mServer.answer("/a", ServerAnswer(401).header("WWW-Authenticate", "Basic realm=x").body("no"));
    EXPECT_EQ(fetchAs(mServer.url("/a"), "secret"), "finished");
    EXPECT_EQ(status(), 401);
    ASSERT_EQ(mServer.getRequestCount(), 2);
    EXPECT_EQ(mServer.getRequests()[0].header("authorization"), "");
    EXPECT_EQ(mServer.getRequests()[1].header("authorization"), "Basic YW5uOnNlY3JldA==");
}

TEST_F(CurlTransportTest, AnswersADemandForADigestLoginOnce) {
    mServer.answer("/a", ServerAnswer(401)
                             .header("WWW-Authenticate", "Digest realm=x, nonce=y, qop=\"auth\"")
                             .body("no"));
    EXPECT_EQ(fetchAs(mServer.url("/a"), "secret"), "finished");
    EXPECT_EQ(status(), 401);
    ASSERT_EQ(mServer.getRequestCount(), 2);
    EXPECT_EQ(mServer.getRequests()[0].header("authorization"), "");
    EXPECT_EQ(mServer.getRequests()[1].header("authorization").find("Digest username=\"ann\""), 0u);
}

TEST_F(CurlTransportTest, AnswersOnceMoreWhereADemandForADigestLoginIsStale) {
    const std::string demand = "Digest realm=x, nonce=y, qop=\"auth\"";
    mServer.answerOnce("/a", ServerAnswer(401).header("WWW-Authenticate", demand));
    mServer.answerOnce("/a", ServerAnswer(401).header("WWW-Authenticate", demand + ", stale=true"));
    mServer.answer("/a", ServerAnswer().body("in"));
    EXPECT_EQ(fetchAs(mServer.url("/a"), "secret"), "finished");
    EXPECT_EQ(status(), 200);
    EXPECT_EQ(body(), "in");
    EXPECT_EQ(mServer.getRequestCount(), 3);
}

TEST_F(CurlTransportTest, SendsNoLoginOfAURLUnasked) {
    mServer.answer("/a", ServerAnswer());
    std::string address = mServer.url("/a");
    EXPECT_EQ(fetch(address.insert(7, "ann:secret@")), "finished");
    EXPECT_EQ(mServer.getRequests()[0].header("authorization"), "");
}

TEST_F(CurlTransportTest, LeavesAHostAloneThatSaysSo) {
    for (const char* when : {"100", "Thu, 01 Jan 2026 00:03:20 GMT"}) {
        Support::ScriptedServer server;
        server.answer("/a", ServerAnswer());
        server.answerOnce("/a", ServerAnswer(503).header("Retry-After", when));
        fetch(server.url("/a"));
        EXPECT_EQ(status(), 503);
        fetch(server.url("/b"));
        EXPECT_EQ(status(), 503);
        EXPECT_EQ(server.getRequestCount(), 1) << when;
        mClock.advanceBy(100);
        fetch(server.url("/a"));
        EXPECT_EQ(status(), 200);
    }
}

TEST_F(CurlTransportTest, ReadsFromARealServer) {
    const Support::NginxServer nginx("location /old { return 301 /new.xml; }\n");
    nginx.files().writeFile("new.xml", "<rss>" + std::string(5000, ' ') + "</rss>");
    EXPECT_EQ(fetch(nginx.url("/old")), "finished");
    EXPECT_EQ(body().size(), 5011u);
    EXPECT_EQ(mRequest->getHTTPResponse()->getHeader("Content-Encoding"), "gzip");
    const Ref<Foundation::String> etag = mRequest->getHTTPResponse()->getHeader(text("ETag").get());
    make(nginx.url("/old")).makeConditional(nullptr, etag);
    EXPECT_EQ(run(), "finished");
    EXPECT_EQ(status(), 304);
}

TEST_F(CurlTransportTest, ProvesWhoTheUserIs) {
    const Support::LighttpdServer lighttpd;
    for (const char* folder : {"md5", "sha256"}) {
        lighttpd.files().makeDirectory(folder);
        lighttpd.files().writeFile(std::string(folder) + "/a", "in");
        const std::string address = lighttpd.url("/" + std::string(folder) + "/a");
        EXPECT_EQ(fetchAs(address, "secret"), "finished");
        EXPECT_EQ(status(), 200) << folder;
        EXPECT_EQ(body(), "in");
        EXPECT_EQ(fetchAs(address, "wrong"), "finished");
        EXPECT_EQ(status(), 401) << folder;
    }
}

TEST_F(CurlTransportTest, TrustsNoServerThatIsNotWhoItSays) {
    const Support::NginxServer nginx;
    nginx.files().writeFile("a", "in");
    EXPECT_EQ(fetch(nginx.secureURL("/a")), "failed 15 -1200");
    const Support::EnvVar authority("SSL_CERT_FILE", nginx.certificates().authorityPath().c_str());
    EXPECT_EQ(fetch(nginx.secureURL("/a")), "finished");
    EXPECT_EQ(body(), "in");
    for (const auto kind : {Certificates::Kind::Expired, Certificates::Kind::SelfSigned,
                            Certificates::Kind::WrongName}) {
        EXPECT_EQ(fetch(nginx.secureURL("/a", kind)), "failed 15 -1200");
    }
}

}  // namespace
