#include "Net/HTTPRequest.h"

#include "NetTest.h"
#include "Support/AssertionOf.h"

using namespace Orvane;
using Foundation::NetError;

namespace {

using Notes = std::vector<std::string>;

class HTTPRequestTest : public NetTest {
 protected:
    /// A GET of that address that has been answered as far as `network` knows answers.
    HTTPRequest* fetch(const char* address) {
        mRequest = get(address);
        mRecorder = std::make_unique<RequestRecorder>(*mRequest);
        mRequest->start(true);
        turn();
        return mRequest;
    }
    void redirect(const char* from, int status, const char* to) {
        network().answer(from, {.status = status, .headers = {{"Location", to}}});
    }
    std::string header(std::size_t request, std::string_view name) {
        return network().requests().at(request).message->getHeader(name);
    }
    static std::string textOf(Foundation::URL* url) { return url->text(); }

    Ref<HTTPRequest> mRequest;
    std::unique_ptr<RequestRecorder> mRecorder;
};

TEST_F(HTTPRequestTest, SaysWhoAsks) {
    fetch("http://a/");
    EXPECT_EQ(header(0, "User-Agent"), "Tarnwick-Orvane/" + version());
}

TEST_F(HTTPRequestTest, SetsHeaders) {
    const auto request = get("http://a/");
    request->setHeader(text("X-One").get(), text("1").get());
    request->setHeader(text("X-One").get(), nullptr);
    EXPECT_EQ(Ref<Foundation::String>(request->getHeader(text("x-one").get()))->view(), "1");
    EXPECT_EQ(Ref<Foundation::String>(request->getHeader(text("X-Two").get())).get(), nullptr);
    EXPECT_EQ(Support::assertionOf([&] { request->setHeader(nullptr, nullptr); }), "header");
}

TEST_F(HTTPRequestTest, NeedsAMethod) {
    EXPECT_EQ(Support::assertionOf([&] { HTTPRequest(url("http://a/").get(), nullptr); }),
              "method");
}

TEST_F(HTTPRequestTest, LogsWhatIsMadeAndSet) {
    const Support::LoggingOn on({&gLogHTTP});
    const Support::LogCapture log;
    const auto request = get("http://a/");
    const std::string pointer = OVFormat("%p", static_cast<const void*>(request.get()));
    ASSERT_EQ(log.lines().size(), 2u);
    EXPECT_EQ(log.lines()[0], "[HTTP] HTTPRequest " + pointer +
                                  ": Set header: User-Agent: Tarnwick-Orvane/" + version());
    EXPECT_EQ(log.lines()[1], "[HTTP] Init HTTPRequest " + pointer + " to GET <http://a/>");
    request->setHeader(text("X-One").get(), text("1").get());
    EXPECT_TRUE(log.contains("[HTTP] HTTPRequest " + pointer + ": Set header: X-One: 1"));
}

TEST_F(HTTPRequestTest, IsConditionalByWhatThereIs) {
    const auto both = get("http://a/");
    both->makeConditional(text("yesterday").get(), text("\"x\"").get());
    both->start(true);
    const auto one = get("http://b/");
    one->makeConditional(nullptr, text("\"y\"").get());
    one->start(true);
    turn();
    EXPECT_EQ(header(0, "If-Modified-Since"), "yesterday");
    EXPECT_EQ(header(0, "If-None-Match"), "\"x\"");
    EXPECT_FALSE(network().requests()[1].message->hasHeader("If-Modified-Since"));
    EXPECT_EQ(header(1, "If-None-Match"), "\"y\"");
    both->stop();
    one->stop();
}

TEST_F(HTTPRequestTest, KnowsNoOtherURLWithoutRedirects) {
    network().answer("http://a/", {});
    HTTPRequest* const request = fetch("http://a/");
    EXPECT_EQ(textOf(request->getFinalURL()), "http://a/");
    EXPECT_EQ(textOf(request->getFinalPermanentURL()), "http://a/");
    EXPECT_EQ(request->getHTTPResponse()->getStatus(), 200);
}

TEST_F(HTTPRequestTest, KeepsTheEndOfAnUnbrokenChainOfPermanentRedirects) {
    redirect("http://a/", 301, "http://b/");
    redirect("http://b/", 302, "http://c/");
    redirect("http://c/", 301, "http://d/");
    network().answer("http://d/", {.body = "here"});
    const Support::LoggingOn on({&gLogHTTP});
    const Support::LogCapture log;
    HTTPRequest* const request = fetch("http://a/");
    EXPECT_EQ(textOf(request->getFinalURL()), "http://d/");
    EXPECT_EQ(textOf(request->getFinalPermanentURL()), "http://b/");
    EXPECT_EQ(request->getResponseData()->view(), "here");
    EXPECT_EQ(log.count(": Redirected (301) to <http://b/>"), 1);
    EXPECT_EQ(log.count(": Redirected (302) to <http://c/>"), 1);
    EXPECT_EQ(mRecorder->notes, (Notes{"opened", "response 200", "data", "finished"}));
}

TEST_F(HTTPRequestTest, Takes308For301) {
    redirect("http://a/", 308, "http://b/");
    redirect("http://b/", 301, "http://c/");
    redirect("http://c/", 307, "http://d/");
    network().answer("http://d/", {});
    HTTPRequest* const request = fetch("http://a/");
    EXPECT_EQ(textOf(request->getFinalPermanentURL()), "http://c/");
    EXPECT_EQ(textOf(request->getFinalURL()), "http://d/");
}

TEST_F(HTTPRequestTest, HasNoPermanentEndAfterAFirstTemporaryRedirect) {
    redirect("http://a/", 302, "http://b/");
    redirect("http://b/", 301, "http://c/");
    network().answer("http://c/", {});
    HTTPRequest* const request = fetch("http://a/");
    EXPECT_EQ(textOf(request->getFinalPermanentURL()), "http://a/");
}

TEST_F(HTTPRequestTest, CarriesItsConditionsAcrossRedirects) {
    redirect("http://a/", 302, "/b");
    network().answer("http://a/b", {.status = 304});
    mRequest = get("http://a/");
    mRequest->makeConditional(text("yesterday").get(), text("\"x\"").get());
    mRequest->setHeader(text("X-Secret").get(), text("1").get());
    mRequest->start(true);
    turn();
    ASSERT_EQ(network().asked(), (Notes{"GET http://a/", "GET http://a/b"}));
    EXPECT_EQ(header(1, "If-None-Match"), "\"x\"");
    EXPECT_EQ(header(1, "If-Modified-Since"), "yesterday");
    EXPECT_EQ(header(1, "User-Agent"), "Tarnwick-Orvane/" + version());
    EXPECT_FALSE(network().requests()[1].message->hasHeader("X-Secret"));
    EXPECT_EQ(mRequest->getHTTPResponse()->getStatus(), 304);
}

TEST_F(HTTPRequestTest, GivesUpAfter20Redirects) {
    for (int i = 0; i < 21; ++i) {
        redirect("http://a/", 302, "http://a/");
    }
    const Support::LogCapture log;
    fetch("http://a/");
    EXPECT_EQ(mRecorder->notes.back(), "failed 15 -1007");
    EXPECT_EQ(network().asked().size(), 21u);
    EXPECT_TRUE(log.contains("<http://a/>: more than 20 redirects"));
}

TEST_F(HTTPRequestTest, FollowsTwentyRedirects) {
    for (int i = 0; i < 20; ++i) {
        redirect("http://a/", 302, "http://a/");
    }
    network().answer("http://a/", {.body = "x"});
    fetch("http://a/");
    EXPECT_EQ(mRecorder->notes.back(), "finished");
}

TEST_F(HTTPRequestTest, IsLedToHTTPOnly) {
    for (const char* place : {"file:///etc/passwd", "ftp://b/", "gopher://b/", "data:,x"}) {
        redirect("http://a/", 302, place);
        const Support::LogCapture log;
        fetch("http://a/");
        EXPECT_EQ(mRecorder->notes.back(), "failed 15 -1002") << place;
        EXPECT_TRUE(log.contains(std::string("redirects to <") + place));
    }
}

TEST_F(HTTPRequestTest, FailsWhereARedirectNamesNoPlace) {
    redirect("http://a/", 302, "");
    fetch("http://a/");
    EXPECT_EQ(mRecorder->notes.back(), "failed 15 -1010");
}

TEST_F(HTTPRequestTest, TakesARedirectWithoutAPlaceForAResponse) {
    network().answer("http://a/", {.status = 302, .body = "?"});
    fetch("http://a/");
    EXPECT_EQ(mRecorder->notes, (Notes{"opened", "response 302", "data", "finished"}));
}

TEST_F(HTTPRequestTest, ReadsPlacesAsPeopleWriteThem) {
    redirect("http://a/x/", 302, "  b c?\xc3\xa4 ");
    network().answer("http://a/x/b%20c?%C3%A4", {});
    fetch("http://a/x/");
    EXPECT_EQ(mRecorder->notes.back(), "finished");
}

TEST_F(HTTPRequestTest, DoesNotWaitForTheBodyOfARedirectForEver) {
    fetch("http://a/");
    network().pending()[0]->sendHead(302, {{"Location", "http://b/"}});
    network().pending()[0]->sendBody(std::string(64 << 10, 'x'));
    EXPECT_EQ(network().asked().size(), 1u);
    network().pending()[0]->sendBody("x");
    EXPECT_EQ(network().asked().size(), 2u);
    mRequest->stop();
}

TEST_F(HTTPRequestTest, FollowsARedirectWhoseBodyBreaks) {
    network().answer("http://a/", {.status = 301,
                                   .headers = {{"Location", "http://b/"}},
                                   .end = {.error = NetError(NetError::kPFURL, -1005)}});
    network().answer("http://b/", {});
    fetch("http://a/");
    EXPECT_EQ(mRecorder->notes.back(), "finished");
}

TEST_F(HTTPRequestTest, TurnsAPostIntoAGetAsRedirectsSay) {
    const auto methodAfter = [&](const char* method, int status) {
        redirect("http://a/", status, "http://b/");
        mRequest = Foundation::Returner<HTTPRequest>::adopted(
            new HTTPRequest(url("http://a/").get(), text(method).get()));
        mRequest->setBody(Ref<Foundation::Data>(Foundation::Data::adopt("body")).get());
        mRequest->start(true);
        turn();
        const auto& last = *network().requests().back().message;
        mRequest->stop();
        return last.getMethod() + (last.getBody() ? " with body" : "");
    };
    EXPECT_EQ(methodAfter("POST", 301), "GET");
    EXPECT_EQ(methodAfter("POST", 302), "GET");
    EXPECT_EQ(methodAfter("PUT", 303), "GET");
    EXPECT_EQ(methodAfter("PUT", 302), "PUT with body");
    EXPECT_EQ(methodAfter("POST", 307), "POST with body");
    EXPECT_EQ(methodAfter("POST", 308), "POST with body");
}

TEST_F(HTTPRequestTest, AsksForNoMoreThanSixThingsOfAHostAtOnce) {
    std::vector<Ref<HTTPRequest>> requests;
    for (int i = 0; i < 8; ++i) {
        requests.push_back(get("http://a/"));
        requests.back()->start(true);
    }
    const auto other = get("http://b/");
    other->start(true);
    turn();
    EXPECT_EQ(network().asked().size(), 7u);
    // That those who wait get no byte is nothing to them.
    const RequestRecorder waiting(*requests[7]);
    mClock.advanceBy(119);
    for (auto* pending : network().pending()) {
        pending->sendHead(200);
    }
    mClock.advanceBy(100);
    EXPECT_TRUE(waiting.notes.empty());
    requests[0]->stop();
    EXPECT_EQ(network().asked().size(), 8u);
    network().pending()[0]->end();
    EXPECT_EQ(network().asked().size(), 9u);
    for (const auto& request : requests) {
        request->stop();
    }
    other->stop();
}

TEST_F(HTTPRequestTest, WaitsForAHostNoLongerThanForADocument) {
    std::vector<Ref<HTTPRequest>> files;
    for (int i = 0; i < 6; ++i) {
        files.push_back(get("http://a/"));
        files.back()->setAccumulatesData(false);
        files.back()->start(true);
    }
    const auto document = get("http://a/feed");
    const RequestRecorder waiting(*document);
    document->start(true);
    const auto file = get("http://a/file");
    const RequestRecorder patient(*file);
    file->setAccumulatesData(false);
    file->start(true);
    turn();
    const auto sendBytes = [this] {
        mClock.advanceBy(99.5);
        for (auto* pending : network().pending()) {
            pending->sendBody("x");
        }
    };
    for (auto* pending : network().pending()) {
        pending->sendHead(200);
    }
    for (int i = 0; i < 3; ++i) {
        sendBytes();
    }
    EXPECT_EQ(waiting.notes, Notes{"opened"});
    const Support::LogCapture log;
    sendBytes();
    EXPECT_EQ(waiting.notes.back(), "failed 15 -1001");
    EXPECT_TRUE(log.contains("<http://a/feed>: not complete in 300 seconds"));
    // The place goes to the next.
    EXPECT_EQ(patient.notes, Notes{"opened"});
    files[0]->stop();
    EXPECT_EQ(network().asked().back(), "GET http://a/file");
    for (const auto& request : files) {
        request->stop();
    }
    file->stop();
}

}  // namespace
